// long-recording MINUTES [amr]: records from an accelerated source (MEWLO_AUDIO_SOURCE) until that much sound is in the
// file. Prints the resident memory (kB) every tenth of the way and at the end how long stopping took (ms).
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <string>

#include "bench/Engines.h"

namespace {

long residentKilobytes()
{
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);) {
        if (line.rfind("VmRSS:", 0) == 0)
            return std::strtol(line.c_str() + 6, nullptr, 10);
    }
    return 0;
}

}

int main(int argc, char** argv)
{
    if (argc < 2)
        return 2;
    const unsigned long long goal = std::strtoull(argv[1], nullptr, 10) * 60000;
    ::setenv("MEWLO_AUDIO_SOURCE", "audiotestsrc is-live=false wave=pink-noise volume=0.3", 0);
    bench::Engines engines;
    if (argc > 2 && std::strcmp(argv[2], "amr") == 0) {
        engines.model.setAudioCodec(MwModel::CODEC_AMR);
        engines.model.setFileFormat(MwModel::FORMAT_AMR);
        engines.model.setSampleRate(8000);
        engines.model.setBitRate(12200);
    }
    if (!engines.controller.dispatchCommand(MwAppController::START_RECORDING))
        return 1;
    for (unsigned long long next = 0; engines.model.getElapsedTime() < goal;) {
        ecore_main_loop_iterate_may_block(EINA_TRUE);
        if (engines.model.getElapsedTime() < next)
            continue;
        std::printf("%llu %ld\n", engines.model.getElapsedTime() / 60000, residentKilobytes());
        std::fflush(stdout);
        next += goal / 10;
    }
    // The accelerated source runs seconds ahead of the encoder and the disk, which a microphone never does: let both
    // catch up.
    engines.controller.dispatchCommand(MwAppController::PAUSE_RECORDING);
    const double settled = bench::milliseconds() + 4000;
    while (bench::milliseconds() < settled)
        ecore_main_loop_iterate();
    const double begin = bench::milliseconds();
    const bool stopped = engines.controller.dispatchCommand(MwAppController::STOP_RECORDING);
    std::printf("%llu %ld\nstop %.1f\n", engines.model.getElapsedTime() / 60000, residentKilobytes(),
        bench::milliseconds() - begin);
    std::printf("file %s\n", engines.controller.getLastSavedPath().c_str());
    return stopped ? 0 : 1;
}
