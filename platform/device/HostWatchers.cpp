#include "device/HostWatchers.h"

#include "host/BatteryWatch.h"
#include "host/CallWatch.h"
#include "host/DisplayWatch.h"
#include "host/LocaleWatch.h"
#include "host/LogindWatch.h"
#include "host/MountWatch.h"
#include "host/PortalWatch.h"
#include "host/PulseWatch.h"
#include "host/ScreenSaverWatch.h"
#include "host/TimeWatch.h"
#include "preference.h"
#include "state/Log.h"
#include "state/Trees.h"
#include "vconf.h"
#include <StateKeys.h>

#include <cstdlib>
#include <memory>

namespace platform {

namespace {

    // A value that another process wrote before is no news.
    void sink(const std::string& key, const std::string& value) { stateTree().writeIfDifferent(key, value); }

    bool rejectsCalls() { return parseBool(stateTree().read(VCONFKEY_CALL_RECORDING_REJECT)).value_or(false); }

    bool isWanted(const std::string& name)
    {
        const char* chosen = std::getenv("MEWLO_HOST");
        const std::string list = chosen != nullptr && *chosen != '\0' ? chosen : "all";
        return list == "all" || ("," + list + ",").find("," + name + ",") != std::string::npos;
    }

    // On the thread of the sound watch; keys may be written from any.
    void reportEarjack(const host::PulseSnapshot& before, const host::PulseSnapshot& now)
    {
        if (before.isHeadsetPlugged != now.isHeadsetPlugged)
            sink(VCONFKEY_SYSMAN_EARJACK, now.isHeadsetPlugged ? "1" : "0");
    }

    void reportMicrophone(const host::PulseSnapshot& before, const host::PulseSnapshot& now)
    {
        if (before.microphones.empty() != now.microphones.empty())
            sink(VCONFKEY_MEWLO_MICROPHONE, now.microphones.empty() ? "0" : "1");
    }

    // State keys end with the session; this fact does not.
    void tellPrivateStorage()
    {
        int method = 0;
        if (preference_get_int(PREFERENCE_PRIVATE_METHOD, &method) == 0)
            sink(KEY_PRIVATE_METHOD, std::to_string(method));
    }

    class HostWatchers {
    public:
        HostWatchers()
        {
            startIfWanted("lock", _logind);
            startIfWanted("lock", _screenSaver);
            startIfWanted("battery", _battery);
            startIfWanted("mounts", _mounts);
            startIfWanted("portal", _portal);
            startIfWanted("time", _time);
            startIfWanted("calls", _calls);
            startIfWanted("locale", _locale);
            startIfWanted("display", _display);
            if (isWanted("private"))
                tellPrivateStorage();
            if (isWanted("earjack"))
                _earjackListener = host::PulseWatch::instance().addListener(reportEarjack);
            if (isWanted("microphone"))
                _microphoneListener = host::PulseWatch::instance().addListener(reportMicrophone);
            _recorderWatch
                = stateTree().watch(VCONFKEY_MEWLO_RECORDER_STATE, [this](const std::string&) { _updateBusy(); });
            _lockWatch = stateTree().watch(VCONFKEY_IDLE_LOCK_STATE, [this](const std::string&) { _lockChanged(); });
        }
        ~HostWatchers()
        {
            stateTree().unwatch(_recorderWatch);
            stateTree().unwatch(_lockWatch);
            for (const int listener : {_earjackListener, _microphoneListener})
                if (listener != 0)
                    host::PulseWatch::instance().removeListener(listener);
        }
        HostWatchers(const HostWatchers&) = delete;
        HostWatchers& operator=(const HostWatchers&) = delete;

    private:
        template <typename Watch>
        static void startIfWanted(const char* name, Watch& watch)
        {
            if (isWanted(name))
                watch.start();
        }

        void _updateBusy()
        {
            constexpr int RECORDING = 2; // and paused is 3
            if (isWanted("lock"))
                _logind.setBusy(stateInt(VCONFKEY_MEWLO_RECORDER_STATE).value_or(0) >= RECORDING);
        }

        // Somebody else than logind wrote "unlocked", such as a button of ours: ask the session to follow.
        void _lockChanged()
        {
            const bool locked = stateInt(VCONFKEY_IDLE_LOCK_STATE).value_or(0) != 0;
            if (!locked && _sessionIsLocked && isWanted("lock"))
                _logind.unlock();
        }

        void _lockSink(const std::string& key, const std::string& value)
        {
            if (key == VCONFKEY_IDLE_LOCK_STATE)
                _sessionIsLocked = value != "0";
            sink(key, value);
        }

        bool _sessionIsLocked = false;
        host::LogindWatch _logind{[this](const std::string& key, const std::string& value) { _lockSink(key, value); }};
        host::ScreenSaverWatch _screenSaver{sink};
        host::BatteryWatch _battery{sink};
        host::MountWatch _mounts{sink};
        host::PortalWatch _portal{sink};
        host::TimeWatch _time{sink};
        host::CallWatch _calls{sink, rejectsCalls};
        host::LocaleWatch _locale{sink};
        host::DisplayWatch _display{sink};
        int _earjackListener = 0;
        int _microphoneListener = 0;
        KeyTree::WatchId _recorderWatch = 0;
        KeyTree::WatchId _lockWatch = 0;
    };

    std::unique_ptr<HostWatchers>& watchers()
    {
        static auto* all = new std::unique_ptr<HostWatchers>;
        return *all;
    }

}

void startHostWatchers() { watchers() = std::make_unique<HostWatchers>(); }

void stopHostWatchers() { watchers().reset(); }

}
