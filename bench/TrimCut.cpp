// bench-trim-cut FILE DIRECTORY: cuts the recording but for its first and last minute beside cp of the same bytes and
// ffmpeg, and reads its waveform beside ffmpeg decoding it; every pair alternating in one run. Prints "NAME
// MILLISECONDS" lines, medians; "memory" is in KB: how much the exact look adds to the resident size at most.
#include <video_edit.h>
#include <volume_samples.h>

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <functional>
#include <mutex>
#include <string>
#include <unistd.h>
#include <vector>

#include "MwText.h"
#include "bench/Engines.h"

namespace {

constexpr int ROUNDS = 5;
constexpr int MINUTE = 60000;
constexpr int END = 59 * MINUTE;

std::mutex mutex;
std::condition_variable changed;
int outcome = 0; // 0 while it runs

void end(int value)
{
    const std::lock_guard lock(mutex);
    outcome = value;
    changed.notify_all();
}

double timeOf(const std::function<void()>& work)
{
    const double begin = bench::milliseconds();
    work();
    return bench::milliseconds() - begin;
}

void print(const char* name, std::vector<double> times)
{
    std::sort(times.begin(), times.end());
    std::printf("%s %.2f\n", name, times[times.size() / 2]);
}

void run(const std::string& command)
{
    if (std::system(command.c_str()) != 0)
        std::fprintf(stderr, "failed: %s\n", command.c_str());
}

void cut(const std::string& from, const std::string& to)
{
    ::close(::open(to.c_str(), O_RDWR | O_CREAT | O_TRUNC, 0600));
    const video_edit_clip_s clip{from.c_str(), 60 * MINUTE, MINUTE, END};
    const video_edit_project_s project{&clip};
    video_edit_init();
    video_edit_set_state_changed_cb([](int) { end(1); });
    video_edit_set_error_received_cb([](int error) { end(error); });
    outcome = 0;
    if (video_edit_prepare(VIDEO_EDIT_PROJECT_SOUND, &project) == 0 && video_edit_export(to.c_str()) == 0) {
        std::unique_lock lock(mutex);
        changed.wait(lock, [] { return outcome != 0; });
    }
    if (outcome != 1)
        std::fprintf(stderr, "the cut failed: %d\n", outcome);
    video_edit_deinit();
}

void measureCut(const std::string& file, const std::string& directory)
{
    const std::string extension = std::filesystem::path(file).extension();
    const std::string result = directory + "/cut" + extension;
    const std::string copy = directory + "/copy" + extension;
    std::vector<double> own;
    std::vector<double> bare;
    std::vector<double> flushed;
    std::vector<double> other;
    for (int round = 0; round < ROUNDS; ++round) {
        std::filesystem::remove(result);
        own.push_back(timeOf([&] { cut(file, result); }));
        std::filesystem::remove(copy);
        bare.push_back(timeOf([&] { run("cp '" + result + "' '" + copy + "'"); }));
        flushed.push_back(bare.back() + timeOf([&] { run("sync '" + copy + "'"); }));
        std::filesystem::remove(copy);
        other.push_back(timeOf([&] {
            run("ffmpeg -v error -ss 60 -i '" + file + "' -t 3480 -c copy '" + copy + "' </dev/null 2>/dev/null");
        }));
    }
    print("cut", own);
    print("cp", bare);
    print("cp+flush", flushed);
    print("ffmpeg-copy", other);
}

long residentKb()
{
    std::ifstream statistics("/proc/self/statm");
    long size = 0;
    long resident = 0;
    statistics >> size >> resident;
    return resident * (::sysconf(_SC_PAGESIZE) / 1024);
}

bool look(const std::string& file, volume_samples_quality_e quality)
{
    const std::atomic<bool> never = false;
    volume_samples_s* samples = nullptr;
    const bool done = mw_get_volume_samples_until(file.c_str(), quality, &never, &samples) == 0;
    if (samples)
        mw_free_volume_samples(samples);
    return done;
}

void measureWaveform(const std::string& file)
{
    std::vector<double> exact;
    std::vector<double> coarse;
    std::vector<double> other;
    std::atomic<long> largest = 0;
    std::atomic<bool> isOver = false;
    look(file, VOLUME_SAMPLES_COARSE); // the libraries are there
    const long before = residentKb();
    std::thread watch([&] {
        for (; !isOver; ::usleep(2000))
            largest = std::max(largest.load(), residentKb());
    });
    for (int round = 0; round < ROUNDS; ++round) {
        exact.push_back(timeOf([&] { look(file, VOLUME_SAMPLES_EXACT); }));
        coarse.push_back(timeOf([&] { look(file, VOLUME_SAMPLES_COARSE); }));
        other.push_back(timeOf([&] { run("ffmpeg -v error -i '" + file + "' -f null - </dev/null"); }));
    }
    isOver = true;
    watch.join();
    print("exact", exact);
    print("coarse", coarse);
    print("ffmpeg-null", other);
    std::printf("memory %ld\n", largest - before);
}

// From the catalogue, as for a recording of our own.
void measureCache(const std::string& file)
{
    media_content_connect();
    media_info_h media = nullptr;
    if (media_info_insert_to_db(file.c_str(), &media) != 0)
        return;
    media_info_destroy(media);
    look(file, VOLUME_SAMPLES_EXACT);
    std::vector<double> cached;
    for (int round = 0; round < ROUNDS; ++round)
        cached.push_back(timeOf([&] { look(file, VOLUME_SAMPLES_EXACT); }));
    print("cached", cached);
    media_content_disconnect();
}

}

int main(int argc, char** argv)
{
    if (argc < 3) {
        std::fprintf(stderr, "usage: bench-trim-cut FILE DIRECTORY\n");
        return 2;
    }
    ::setenv("MEWLO_MEDIA_DB", (std::string(argv[2]) + "/bench.db").c_str(), 1);
    measureCut(argv[1], argv[2]);
    measureWaveform(argv[1]);
    measureCache(argv[1]);
    return 0;
}
