#include <recorder.h>

#include <Ecore.h>

#include <gtest/gtest.h>

#include <cstring>

namespace {

// A second process for the crash tests: records until it is killed, or commits after some milliseconds and then holds
// what it recorded without saving it.
int recordUntilKilled(const char* path, const char* format, int commitAfterMs)
{
    recorder_h recorder = nullptr;
    recorder_create_audiorecorder(&recorder);
    const bool isAmr = std::strcmp(format, "amr") == 0;
    recorder_set_audio_encoder(recorder, isAmr ? RECORDER_AUDIO_CODEC_AMR : RECORDER_AUDIO_CODEC_AAC);
    recorder_set_file_format(recorder, isAmr ? RECORDER_FILE_FORMAT_AMR : RECORDER_FILE_FORMAT_MP4);
    recorder_set_filename(recorder, path);
    if (recorder_prepare(recorder) != 0 || recorder_start(recorder) != 0)
        return 1;
    if (commitAfterMs > 0)
        ecore_timer_add(
            commitAfterMs / 1000.0,
            [](void* data) -> Eina_Bool {
                recorder_commit(static_cast<recorder_h>(data));
                return ECORE_CALLBACK_CANCEL;
            },
            recorder);
    ecore_main_loop_begin();
    return 0;
}

}

int main(int argc, char** argv)
{
    ecore_app_no_system_modules();
    ecore_init();
    if (argc == 5 && std::strcmp(argv[1], "--record") == 0)
        return recordUntilKilled(argv[2], argv[3], std::atoi(argv[4]));
    testing::InitGoogleTest(&argc, argv);
    const int result = RUN_ALL_TESTS();
    ecore_shutdown();
    return result;
}
