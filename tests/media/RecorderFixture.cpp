#include "RecorderFixture.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <utility>

using support::outputOf;

RecorderHandle::RecorderHandle(std::string temporaryPath)
    : path(std::move(temporaryPath))
{
    EXPECT_EQ(0, recorder_create_audiorecorder(&handle));
    static const auto size
        = [](void* data) { return std::to_string(support::readFile(static_cast<RecorderHandle*>(data)->path).size()); };
    recorder_set_recording_status_cb(
        handle,
        [](unsigned long long elapsed, unsigned long long, void* data) {
            static_cast<RecorderHandle*>(data)->told.elapsed.push_back(elapsed);
        },
        this);
    recorder_set_recording_limit_reached_cb(
        handle,
        [](recorder_recording_limit_type_e type, void* data) {
            auto* self = static_cast<RecorderHandle*>(data);
            self->told.limits.push_back(type);
            self->told.stateWhenInterrupted = self->state();
            self->told.fileWhenEnded = size(data);
        },
        this);
    recorder_set_interrupted_cb(
        handle,
        [](recorder_policy_e policy, recorder_state_e, recorder_state_e, void* data) {
            auto* self = static_cast<RecorderHandle*>(data);
            self->told.interruptions.push_back(policy);
            self->told.stateWhenInterrupted = self->state();
            self->told.fileWhenEnded = size(data);
        },
        this);
    recorder_set_state_changed_cb(
        handle,
        [](recorder_state_e, recorder_state_e current, bool, void* data) {
            static_cast<RecorderHandle*>(data)->told.states.push_back(current);
        },
        this);
    recorder_set_error_cb(
        handle,
        [](int error, recorder_state_e, void* data) {
            static_cast<RecorderHandle*>(data)->told.errors.push_back(error);
        },
        this);
    recorder_set_filename(handle, path.c_str());
}

void RecorderHandle::useAmr()
{
    recorder_set_audio_encoder(handle, RECORDER_AUDIO_CODEC_AMR);
    recorder_set_file_format(handle, RECORDER_FILE_FORMAT_AMR);
    recorder_attr_set_audio_samplerate(handle, 8000);
    recorder_attr_set_audio_encoder_bitrate(handle, 12200);
}

int RecorderHandle::prepareAndStart()
{
    const int error = recorder_prepare(handle);
    return error != 0 ? error : recorder_start(handle);
}

recorder_state_e RecorderHandle::state() const
{
    recorder_state_e state = RECORDER_STATE_NONE;
    recorder_get_state(handle, &state);
    return state;
}

void RecorderHandle::destroy()
{
    if (handle != nullptr)
        recorder_destroy(std::exchange(handle, nullptr));
}

bool RecorderHandle::recordUntil(unsigned long long elapsedMs, double limit) const
{
    return support::runUntil([&] { return !told.elapsed.empty() && told.elapsed.back() >= elapsedMs; }, limit);
}

std::vector<Leftover> rescue(const std::string& temporaryPath)
{
    std::vector<Leftover> found;
    const int count = recorder_rescue_leftovers(
        temporaryPath.c_str(),
        [](recorder_leftover_e outcome, const char* path, recorder_file_format_e format, int duration,
            const char* sidecar, void* data) {
            static_cast<std::vector<Leftover>*>(data)->push_back(
                {outcome, path, format, duration, sidecar != nullptr ? sidecar : ""});
        },
        &found);
    EXPECT_EQ(static_cast<size_t>(count), found.size());
    return found;
}

double probedDuration(const std::string& path)
{
    // The prober guesses at AMR, whose frames of ours are all of one size.
    char magic[6] = {};
    std::ifstream(path, std::ios::binary).read(magic, sizeof magic);
    if (std::string(magic, 5) == "#!AMR")
        return static_cast<double>(std::filesystem::file_size(path) - 6) / 32 * 20;
    const std::string seconds
        = outputOf("ffprobe -v error -select_streams a -show_entries stream=duration -of csv=p=0 '" + path + "'");
    return seconds.empty() ? -1 : std::atof(seconds.c_str()) * 1000;
}

void makeRecording(const std::string& path, int seconds, bool isAmr)
{
    setenv("MEWLO_AUDIO_SOURCE", "audiotestsrc is-live=false volume=0.2 samplesperbuffer=441", 1);
    RecorderHandle recorder(path);
    if (isAmr)
        recorder.useAmr();
    recorder_attr_set_time_limit(recorder.handle, seconds);
    EXPECT_EQ(0, recorder.prepareAndStart());
    EXPECT_TRUE(support::runUntil([&] { return !recorder.told.limits.empty(); }, 60));
    EXPECT_EQ(0, recorder_commit(recorder.handle));
    recorder_release_temporary(path.c_str());
    unsetenv("MEWLO_AUDIO_SOURCE");
}

std::vector<short> heard(const std::string& path)
{
    outputOf("gst-launch-1.0 -q filesrc location='" + path
        + "' ! qtdemux ! aacparse ! avdec_aac ! audioconvert ! "
          "audio/x-raw,format=S16LE,channels=1 ! filesink location='"
        + path + ".raw'");
    const std::string bytes = support::readFile(path + ".raw");
    std::filesystem::remove(path + ".raw");
    std::vector<short> samples(bytes.size() / 2);
    std::memcpy(samples.data(), bytes.data(), samples.size() * 2);
    return samples;
}

bool decodesCleanly(const std::string& path)
{
    return outputOf("ffmpeg -v error -i '" + path + "' -f null - 2>&1 && echo fine") == "fine\n";
}

std::vector<std::string> filesIn(const std::string& directory)
{
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(directory))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

RecorderTest::RecorderTest() { EXPECT_TRUE(server.isUp()); }

RecorderTest::~RecorderTest()
{
    recorder_release_temporary(temporary.c_str());
    support::runFor(0.05); // lets calls arrive that are on their way
}

SourceTest::SourceTest()
{
    useSource("audiotestsrc is-live=true wave=white-noise samplesperbuffer=441");
    setenv("PULSE_SERVER", "unix:/nonexistent/no-server", 1);
}

SourceTest::~SourceTest()
{
    recorder_release_temporary(temporary.c_str());
    support::runFor(0.05);
    unsetenv("MEWLO_AUDIO_SOURCE");
    unsetenv("PULSE_SERVER");
}

void SourceTest::useSource(const std::string& description) { setenv("MEWLO_AUDIO_SOURCE", description.c_str(), 1); }
