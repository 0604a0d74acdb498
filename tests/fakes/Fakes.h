#pragma once

#include <app_control.h>
#include <media_key.h>
#include <minicontrol.h>
#include <notification_control.h>
#include <player.h>
#include <recorder.h>
#include <recorder_leftover.h>
#include <remote_player.h>
#include <sound_manager.h>

#include <algorithm>
#include <atomic>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <vector>

// Link-time replacements of the services: each function records its call, fails when told to, and callbacks are fired
// by the test. Link the sources of the services to replace in front of the platform library.
namespace fakes {

// Every call in order, with its interesting arguments, such as "recorder_attr_set_time_limit 63".
class Calls {
public:
    int record(const std::string& name, const std::string& arguments = "");
    [[nodiscard]] std::vector<std::string> all() const;
    // Those that start with the prefix.
    [[nodiscard]] std::vector<std::string> matching(const std::string& prefix) const;
    [[nodiscard]] size_t count(const std::string& prefix) const { return matching(prefix).size(); }
    [[nodiscard]] bool has(const std::string& prefix) const { return count(prefix) > 0; }
    void failWith(const std::string& name, int code);
    void clear();

private:
    mutable std::mutex _mutex;
    std::vector<std::string> _calls;
    std::map<std::string, int> _failures;
};

extern Calls calls;

struct Recorder {
    recorder_state_e state = RECORDER_STATE_CREATED;
    double level = -20.0;
    bool someoneRecords = false;
    std::string fileName;
    // Called by recorder_commit and recorder_start on the thread that calls them.
    std::function<void()> onStart;
    std::function<void()> onCommit;
    std::function<int(const char* path, recorder_leftover_cb callback, void* userData)> onRescue;

    recorder_error_cb error = nullptr;
    recorder_interrupted_cb interrupted = nullptr;
    recorder_recording_limit_reached_cb limitReached = nullptr;
    recorder_recording_status_cb status = nullptr;
    void* userData = nullptr;
};

struct Player {
    player_state_e state = PLAYER_STATE_IDLE;
    int duration = 10000;
    int position = 0;
    player_completed_cb completed = nullptr;
    player_interrupted_cb interrupted = nullptr;
    player_error_cb error = nullptr;
    player_seek_completed_cb seekCompleted = nullptr;
    void* userData = nullptr;
};

struct Sound {
    sound_device_out_e route = SOUND_DEVICE_OUT_SPEAKER;
    sound_manager_active_device_changed_cb deviceChanged = nullptr;
    void* userData = nullptr;
};

// A control window that was made, until it is deleted. By viewer.
struct ControlWindow {
    Evas_Object* window = nullptr;
    minicontrol_provider_event_cb callback = nullptr;
    bool isSeen = true;
};
extern std::map<int, ControlWindow> controlWindows;
void setSeen(int viewer, bool seen);
extern bool hasControlWindows;

// The notification in place of a control window: "title|text|key|key..." while it is there.
struct Notification {
    notification_control_changed_cb changed = nullptr;
    void* changedData = nullptr;
    bool isSupported = false;
    std::string text;
    std::function<void(const char* key)> press;
};
extern Notification notification;
void setNotificationSupported(bool supported);

struct Desktop {
    media_key_event_cb mediaKey = nullptr;
    void* mediaKeyData = nullptr;
    remote_player_callbacks_s remote{};
    void* remoteData = nullptr;
    int seekedTo = -1; // milliseconds
    std::string lastMessage;
    std::vector<std::string> indicator;
    int liveCalls = 0;
};

// The reply given to a launch request.
struct Reply {
    int result = 99; // none yet
    std::map<std::string, std::string> extras;
};

extern Recorder recorder;
extern Player player;
extern Sound sound;
extern Desktop desktop;
extern Reply reply;

// What was logged, colours removed.
struct Log {
    [[nodiscard]] bool has(const std::string& text) const;
    [[nodiscard]] size_t count(const std::string& text) const;
    void clear();
};
extern Log log;

// All back to the beginning.
void reset();

// A request as the application receives it.
app_control_h makeRequest(const char* operation, const char* mime = nullptr, const char* size = nullptr);

}
