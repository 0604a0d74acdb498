#include "Commands.h"

#include <Ecore.h>
#include <Ecore_File.h>
#include <app.h>
#include <media_content.h>
#include <notification.h>
#include <panekit/WLanguage.h>
#include <panekit/WTimer.h>
#include <panekit/WWindowController.h>
#include <recorder.h>

#include <cstdio>
#include <cstdlib>
#include <libintl.h>

#include "MwAppController.h"
#include "MwModel.h"
#include "MwSystemMgr.h"
#include "MwText.h"

namespace {

// The model, the controller and the services, without a window.
class Engines {
public:
    Engines()
    {
        ecore_init();
        ecore_file_init();
        panekit::WLanguage::initialize();
        bindtextdomain("mewlo-lite", (mwAdopt(app_get_resource_path()) + "locale").c_str());
        textdomain("mewlo-lite");
        media_content_connect();
        // Like a recording made for another program: the state of the recorder application stays its own.
        _model.setRequestMode(true);
        _model.setAppState(MwModel::APP_STATE_RESUMED);
        MwSystemMgr::getInstance()->initialize(&_model);
        _ready = _controller.initialize(&_model, &_window);
    }
    ~Engines()
    {
        _controller.deinitialize();
        MwSystemMgr::getInstance()->deinitialize();
        MwSystemMgr::destroyInstance();
        media_content_disconnect();
        ecore_file_shutdown();
        ecore_shutdown();
    }
    Engines(const Engines&) = delete;
    Engines& operator=(const Engines&) = delete;

    [[nodiscard]] bool ready() const { return _ready; }
    MwModel& model() { return _model; }
    MwAppController& controller() { return _controller; }

private:
    MwModel _model;
    panekit::WWindowController _window{"mewlo-tool", 0};
    MwAppController _controller;
    bool _ready = false;
};

int complain()
{
    const char* message = notification_status_message_last();
    std::fprintf(stderr, "mewlo-tool: %s\n", message != nullptr && *message != '\0' ? message : "the recording failed");
    return tool::FAILED;
}

Eina_Bool quitCb(void*, int, void*)
{
    ecore_main_loop_quit();
    return ECORE_CALLBACK_DONE;
}

void useAmr(MwModel& model)
{
    model.setAudioCodec(MwModel::CODEC_AMR);
    model.setFileFormat(MwModel::FORMAT_AMR);
    model.setSampleRate(RECORDER_AMR_SAMPLE_RATE);
    model.setBitRate(RECORDER_AMR_BIT_RATE);
}

// Ends the loop after the time, at a signal, or when the recording ended by itself.
void waitForTheEnd(MwAppController& controller, const MwModel& model, double seconds)
{
    const auto ended = [&model](void*) {
        if (model.getRecorderState() == REC_STATE_RECORDING)
            return true;
        ecore_main_loop_quit();
        return false;
    };
    const auto watch = panekit::WTimer::addTimer(0.1, ended);
    const auto end = panekit::WTimer::addTimer(seconds, [](void*) {
        ecore_main_loop_quit();
        return false;
    });
    Ecore_Event_Handler* signal = ecore_event_handler_add(ECORE_EVENT_SIGNAL_EXIT, quitCb, nullptr);
    ecore_main_loop_begin();
    ecore_event_handler_del(signal);
    panekit::WTimer::destroy(watch);
    panekit::WTimer::destroy(end);
    if (model.getRecorderState() == REC_STATE_RECORDING)
        controller.dispatchCommand(MwAppController::STOP_RECORDING);
}

}

int tool::record(const Arguments& arguments)
{
    char* end = nullptr;
    const double seconds = arguments.empty() ? 0 : std::strtod(arguments[0].c_str(), &end);
    const std::string format = option(arguments, "--format");
    if (seconds <= 0 || *end != '\0' || (!format.empty() && format != "m4a" && format != "amr")) {
        std::fputs("usage: mewlo-tool record SECONDS [--format m4a|amr]\n", stderr);
        return WRONG_USE;
    }
    Engines engines;
    if (!engines.ready())
        return complain();
    if (format == "amr")
        useAmr(engines.model());
    engines.model().updateLastRecordedFileNumber();
    if (MwSystemMgr::getInstance()->isStorageFull()) {
        std::fputs("mewlo-tool: no room to record\n", stderr);
        return FAILED;
    }
    if (!engines.controller().dispatchCommand(MwAppController::START_RECORDING))
        return complain();
    waitForTheEnd(engines.controller(), engines.model(), seconds);
    const std::string path = engines.controller().getLastSavedPath();
    if (path.empty())
        return complain();
    std::puts(path.c_str());
    return OK;
}
