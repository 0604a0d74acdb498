#include "support/PulseServer.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>

namespace support {

namespace {

    void putWord(std::string& out, uint32_t value, int bytes)
    {
        for (int i = 0; i < bytes; ++i)
            out.push_back(static_cast<char>(value >> (8 * i)));
    }

    void writeWav(const std::string& path, const std::vector<int16_t>& samples, int rate)
    {
        const auto bytes = static_cast<uint32_t>(samples.size() * 2);
        std::string wav = "RIFF";
        putWord(wav, 36 + bytes, 4);
        wav += "WAVEfmt ";
        putWord(wav, 16, 4);
        putWord(wav, 1, 2);
        putWord(wav, 1, 2);
        putWord(wav, static_cast<uint32_t>(rate), 4);
        putWord(wav, static_cast<uint32_t>(rate * 2), 4);
        putWord(wav, 2, 2);
        putWord(wav, 16, 2);
        wav += "data";
        putWord(wav, bytes, 4);
        wav.append(reinterpret_cast<const char*>(samples.data()), bytes);
        writeFile(path, wav);
    }

}

PulseServer::PulseServer()
{
    const char* previous = getenv("PULSE_SERVER");
    _previousServer = previous != nullptr ? previous : "";
    const std::string runtime = _directory.file("rt");
    std::filesystem::create_directories(runtime);
    std::filesystem::create_directories(_directory.file("state"));
    std::filesystem::permissions(runtime, std::filesystem::perms::owner_all);
    setenv("PULSE_RUNTIME_PATH", runtime.c_str(), 1);
    setenv("PULSE_STATE_PATH", _directory.file("state").c_str(), 1);
    setenv("PULSE_COOKIE", _directory.file("state/cookie").c_str(), 1);
    setenv("XDG_RUNTIME_DIR", runtime.c_str(), 1);
    // Without norewinds a null sink works in blocks of two seconds.
    _daemon = Program({"pulseaudio", "-n", "--daemonize=no", "--exit-idle-time=-1", "--disallow-exit=yes",
        "--use-pid-file=no", "--log-target=file:" + _directory.file("pa.log"), //
        "-L", "module-native-protocol-unix socket=" + runtime + "/native auth-anonymous=1", //
        "-L", "module-null-sink sink_name=spk norewinds=1", //
        "-L", "module-null-sink sink_name=mic norewinds=1 rate=44100 channels=1", //
        "-L", "module-remap-source source_name=micsrc master=mic.monitor", //
        "-L", "module-role-cork trigger_roles=phone,alarm,event,notification cork_roles=music,video"});
    setenv("PULSE_SERVER", address().c_str(), 1);
    _up = waitFor([this] { return control("info").find("Server Name") != std::string::npos; }, 20);
    (void)control("set-default-sink spk");
    (void)control("set-default-source micsrc");
}

PulseServer::~PulseServer()
{
    kill();
    for (const char* name :
        {"PULSE_RUNTIME_PATH", "PULSE_STATE_PATH", "PULSE_COOKIE", "XDG_RUNTIME_DIR", "PULSE_SERVER"})
        unsetenv(name);
    if (!_previousServer.empty())
        setenv("PULSE_SERVER", _previousServer.c_str(), 1);
}

void PulseServer::signal(int number) const { _daemon.signal(number); }

void PulseServer::kill() { _daemon.end(); }

Program PulseServer::speak(const std::string& wav) const
{
    return Program({"paplay", "--latency-msec=150", "--device=mic", wav});
}

Program PulseServer::playAs(const std::string& role, const std::string& wav) const
{
    return Program({"paplay", "--latency-msec=20", "--device=spk", "--property=media.role=" + role, wav});
}

Program PulseServer::recordElsewhere() const
{
    return Program({"parecord", "--latency-msec=20", "--device=micsrc", "--raw", "/dev/null"});
}

std::string PulseServer::control(const std::string& pactlArguments) const
{
    return outputOf("LC_ALL=C pactl " + pactlArguments);
}

std::string PulseServer::load(const std::string& moduleAndArguments) const
{
    const std::string number = control("load-module " + moduleAndArguments);
    return number.substr(0, number.find('\n'));
}

void PulseServer::unload(const std::string& moduleNumberOrName) const
{
    (void)control("unload-module " + moduleNumberOrName);
}

void writeNoise(const std::string& path, double seconds, int rate)
{
    std::mt19937 random(20);
    std::uniform_int_distribution<int> value(-9000, 9000);
    std::vector<int16_t> samples(static_cast<size_t>(seconds * rate));
    for (auto& sample : samples)
        sample = static_cast<int16_t>(value(random));
    writeWav(path, samples, rate);
}

void writeTone(const std::string& path, double seconds, double amplitude, int rate)
{
    std::vector<int16_t> samples(static_cast<size_t>(seconds * rate));
    for (size_t i = 0; i < samples.size(); ++i)
        samples[i] = static_cast<int16_t>(amplitude * 32767 * std::sin(2 * M_PI * 440 * static_cast<double>(i) / rate));
    writeWav(path, samples, rate);
}

std::vector<short> decode(const std::string& path, int rate)
{
    const std::string raw
        = outputOf("ffmpeg -v error -i '" + path + "' -f s16le -ac 1 -ar " + std::to_string(rate) + " -");
    std::vector<short> samples(raw.size() / 2);
    std::memcpy(samples.data(), raw.data(), samples.size() * 2);
    return samples;
}

}
