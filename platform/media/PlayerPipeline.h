#pragma once

#include <Ecore.h>
#include <gst/gst.h>

#include <functional>
#include <memory>
#include <string>

namespace media {

// One file on its way to the loudspeaker. Main loop only; the events arrive there from the bus and may destroy the
// pipeline.
class PlayerPipeline {
public:
    struct Events {
        std::function<void()> ended;
        std::function<void()> seekDone;
        std::function<void(bool shallPause)> requested; // by the sound server: pause for another stream, go on after it
        std::function<void(bool isSink, const std::string& reason)> failed;
    };
    enum class Opened { OK, UNREADABLE, NO_SOUND };

    // Opens the file up to its first sound, paused. Known formats get a chain of their own, others the decoder's
    // choice.
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
    PlayerPipeline() = default;
    bool _build(const std::string& description, const std::string& path);
    Opened _preroll();
    void _listen();
    void _handle(GstMessage* message);
    void _handleError(GstMessage* message);
    void _handleRequest(GstMessage* message) const;
    [[nodiscard]] bool _isFromSink(GstMessage* message) const;

    static Eina_Bool _busCb(void* self, Ecore_Fd_Handler* handler);

    std::shared_ptr<const Events> _events; // shared: a call that destroys the pipeline still runs in them
    GstElement* _pipeline = nullptr;
    GstElement* _sink = nullptr;
    GstBus* _bus = nullptr;
    Ecore_Fd_Handler* _handler = nullptr;
    bool _isFailed = false; // errors come in pairs; the first one counts
    std::shared_ptr<bool> _isAlive = std::make_shared<bool>(true);
};

}
