#pragma once

#include "media/StepThread.h"

#include <Ecore.h>
#include <gst/gst.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>

namespace media {

// One file on its way to the loudspeaker. Main loop only, which it never holds for long: what talks to file and sound
// server runs as steps of a thread of its own. The events arrive on the main loop and may destroy the pipeline.
class PlayerPipeline {
public:
    struct Events {
        std::function<void()> ended;
        std::function<void()> seekDone;
        std::function<void(bool shallPause)> requested; // by the sound server: pause for another stream, go on after it
        std::function<void(bool isSink, const std::string& reason)> failed;
    };
    enum class Opened { OK, UNREADABLE, NO_SOUND };

    // Opens the file up to its first sound, paused; what takes longer than a moment goes on by itself and, when it
    // comes to nothing, fails later. Known formats get a chain of their own, others the decoder's choice.
    static std::unique_ptr<PlayerPipeline> open(const std::string& path, const Events& events, Opened& opened);
    ~PlayerPipeline();
    PlayerPipeline(const PlayerPipeline&) = delete;
    PlayerPipeline& operator=(const PlayerPipeline&) = delete;

    bool play();
    bool pause();
    bool seek(int milliseconds, bool isAccurate);
    // -1 when not known at the moment.
    [[nodiscard]] int position() const;
    [[nodiscard]] int duration() const;

private:
    struct Elements;

    PlayerPipeline();
    bool _build(const std::string& description, const std::string& path);
    void _change(GstState state);
    bool _send(int milliseconds, bool isAccurate) const;
    void _opened();
    void _giveUp();
    Opened _preroll();
    void _listen();
    void _handle(GstMessage* message);
    void _handleError(GstMessage* message);
    void _handleRequest(GstMessage* message) const;
    [[nodiscard]] bool _isFromSink(GstMessage* message) const;

    static Eina_Bool _patienceCb(void* self);
    static Eina_Bool _busCb(void* self, Ecore_Fd_Handler* handler);

    std::shared_ptr<const Events> _events; // shared: a call that destroys the pipeline still runs in them
    const std::shared_ptr<StepThread> _steps;
    std::shared_ptr<Elements> _elements; // until the last step has ended, which may be after this object
    Ecore_Fd_Handler* _handler = nullptr;
    Ecore_Timer* _patience = nullptr; // while the file is still being opened
    std::optional<std::pair<int, bool>> _waitingSeek; // until it is
    bool _isFailed = false; // errors come in pairs; the first one counts
    std::shared_ptr<bool> _isAlive = std::make_shared<bool>(true);
};

}
