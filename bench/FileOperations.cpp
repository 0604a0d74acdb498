// bench-file-operations DIRECTORY OTHER_DIRECTORY [MEGABYTES [FILES]]: moves one file between the directories, which
// should be on two file systems, beside cp; and deletes many files beside rm. Prints milliseconds and ratios; every
// pair is measured alternating in one run. cp leaves the data to be written later, a move has it on the disk: so the
// time of cp with a flush of its copy is printed, too. The trash is the one of the user.
#include <media_content.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <unistd.h>
#include <vector>

#include "MwFileDeleter.h"
#include "MwFileMover.h"
#include "MwMediaRow.h"
#include "MwText.h"
#include "bench/Engines.h"

namespace {

constexpr int ROUNDS = 5;
constexpr size_t RECORDING_BYTES = 100000;

double timeOf(const std::function<void()>& work)
{
    const double begin = bench::milliseconds();
    work();
    return bench::milliseconds() - begin;
}

double median(std::vector<double> times)
{
    std::sort(times.begin(), times.end());
    return times[times.size() / 2];
}

void writeFile(const std::string& path, size_t bytes)
{
    const std::string block(1 << 20, 'a');
    std::ofstream file(path, std::ios::binary);
    for (size_t done = 0; done < bytes; done += block.size())
        file.write(block.data(), static_cast<std::streamsize>(std::min(block.size(), bytes - done)));
}

void run(const std::string& command)
{
    if (std::system(command.c_str()) != 0)
        std::fprintf(stderr, "failed: %s\n", command.c_str());
}

void flush(const std::string& path)
{
    const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    ::fsync(file);
    ::close(file);
}

void measureMove(const std::string& from, const std::string& to, size_t bytes)
{
    const std::string source = from + "/bench.m4a";
    const std::string copy = to + "/copy.m4a";
    std::vector<double> own;
    std::vector<double> bare;
    std::vector<double> flushed;
    for (int round = 0; round < ROUNDS; ++round) {
        writeFile(source, bytes);
        flush(source);
        bare.push_back(timeOf([&] { run("cp '" + source + "' '" + copy + "'"); }));
        flushed.push_back(bare.back() + timeOf([&] { flush(copy); }));
        ::unlink(copy.c_str());
        const std::atomic<bool> cancelled = false;
        MwFileMover mover(
            to, bytes, cancelled, [](const std::string&) { return MwClashAction::REPLACE; }, [](uint64_t) {});
        std::string destination;
        own.push_back(timeOf([&] { (void)mover.move(source, destination); }));
        ::unlink(destination.c_str());
    }
    std::printf("move %zu MB %s to %s: %.0f ms, cp %.0f ms (ratio %.2f), cp and flush %.0f ms (ratio %.2f)\n",
        bytes >> 20, from.c_str(), to.c_str(), median(own), median(bare), median(own) / median(bare), median(flushed),
        median(own) / median(flushed));
}

struct Recordings {
    std::vector<std::string> paths;
    std::vector<std::string> ids;
};

Recordings writeRecordings(const std::string& directory, int count)
{
    Recordings made;
    for (int i = 0; i < count; ++i) {
        made.paths.push_back(directory + "/bench" + std::to_string(i) + ".m4a");
        writeFile(made.paths.back(), RECORDING_BYTES);
    }
    ::sync();
    media_content_scan_folder(directory.c_str(), nullptr, nullptr);
    const auto collect = [](media_info_h media, void* data) {
        char* id = nullptr;
        media_info_get_media_id(media, &id);
        static_cast<Recordings*>(data)->ids.push_back(mwAdopt(id));
        return true;
    };
    media_info_foreach_media_from_db(nullptr, collect, &made);
    return made;
}

void measureDelete(const std::string& parent, int count)
{
    const std::string directory = parent + "/bench-files";
    std::vector<double> own;
    std::vector<double> bare;
    std::vector<double> commit;
    for (int round = 0; round < ROUNDS; ++round) {
        std::filesystem::create_directories(directory);
        Recordings files = writeRecordings(directory, count);
        bare.push_back(timeOf([&] { run("rm " + directory + "/*"); }));
        commit.push_back(timeOf([&] { MwMediaRow::remove(files.ids); }));
        files = writeRecordings(directory, count);
        own.push_back(timeOf([&] {
            MwFileDeleter deleter(false);
            for (size_t i = 0; i < files.paths.size(); ++i)
                deleter.remove(files.paths[i], files.ids.at(i));
            (void)deleter.finish();
        }));
    }
    std::filesystem::remove_all(directory);
    const double line = 2 * median(bare) + median(commit);
    std::printf("delete %d files in %s: %.1f ms, rm %.1f ms, commit %.1f ms (ratio to 2 rm + commit %.2f)\n", count,
        parent.c_str(), median(own), median(bare), median(commit), median(own) / line);
}

}

int main(int argc, char** argv)
{
    if (argc < 3) {
        std::fputs("usage: bench-file-operations DIRECTORY OTHER_DIRECTORY [MEGABYTES [FILES]]\n", stderr);
        return 2;
    }
    const size_t megabytes = argc > 3 ? std::strtoul(argv[3], nullptr, 10) : 1024;
    const int files = argc > 4 ? std::atoi(argv[4]) : 1000;
    const std::string database = std::string(argv[1]) + "/bench-media.db";
    ::setenv("MEWLO_MEDIA_DB", database.c_str(), 1);
    bench::Engines engines;
    measureMove(argv[1], argv[2], megabytes << 20);
    measureMove(argv[2], argv[1], megabytes << 20);
    measureDelete(argv[1], files);
    measureDelete(argv[2], files);
    for (const char* suffix : {"", "-wal", "-shm", ".changed", ".lock"})
        ::unlink((database + suffix).c_str());
    return 0;
}
