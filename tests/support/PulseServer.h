#pragma once

#include "support/Program.h"
#include "support/TempDir.h"

#include <string>
#include <vector>

namespace support {

// A private PulseAudio daemon with a loudspeaker ("spk"), and a virtual microphone ("micsrc") that hears what is played
// into the sink "mic". Runs as root or as a user; several can run at once. While it lives, PULSE_SERVER, PULSE_COOKIE
// and XDG_RUNTIME_DIR of this process point to it. Calls and alarms pause music as on a phone.
class PulseServer {
public:
    PulseServer();
    ~PulseServer();
    PulseServer(const PulseServer&) = delete;
    PulseServer& operator=(const PulseServer&) = delete;

    [[nodiscard]] bool isUp() const { return _up; }
    [[nodiscard]] std::string address() const { return "unix:" + _directory.path() + "/rt/native"; }

    // Plays a sound file into the microphone.
    [[nodiscard]] Program speak(const std::string& wav) const;
    // Plays a sound file on the loudspeaker under a media role such as "phone", "alarm" or "notification".
    [[nodiscard]] Program playAs(const std::string& role, const std::string& wav) const;
    // Another application that records.
    [[nodiscard]] Program recordElsewhere() const;

    // Answers the module's number, empty when it could not be loaded.
    [[nodiscard]] std::string load(const std::string& moduleAndArguments) const;
    void unload(const std::string& moduleNumberOrName) const;
    [[nodiscard]] std::string control(const std::string& pactlArguments) const;
    // SIGSTOP lets the daemon hang, SIGCONT go on.
    void signal(int number) const;
    // Ends the daemon as a crash would.
    void kill();

private:
    TempDir _directory;
    Program _daemon;
    std::string _previousServer;
    bool _up = false;
};

// Writes a 16-bit mono sound file. noise: white noise of a fixed seed (every part of it is recognisable).
void writeNoise(const std::string& path, double seconds, int rate = 44100);
void writeTone(const std::string& path, double seconds, double amplitude, int rate = 44100);
// The decoded samples of any sound file, mono.
std::vector<short> decode(const std::string& path, int rate = 44100);

}
