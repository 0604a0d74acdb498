#include <gtest/gtest.h>

#include "MwModel.h"
#include "MwPlayer.h"
#include "MwRecorder.h"
#include "MwSignalMgr.h"
#include "MwSoundSession.h"
#include "fakes/Fakes.h"
#include "support/RunUntil.h"

namespace {

using fakes::calls;

const std::vector<std::string> START_SEQUENCE
    = {"recorder_get_state", "recorder_attr_set_audio_device", "recorder_set_audio_encoder", "recorder_set_file_format",
        "recorder_attr_set_audio_samplerate", "recorder_attr_set_audio_encoder_bitrate", "recorder_attr_set_size_limit",
        "recorder_attr_set_time_limit", "recorder_set_filename", "recorder_attr_set_audio_tuning",
        "recorder_attr_set_recording_type_tag", "recorder_prepare", "recorder_start"};

class MwRecorderTest : public ::testing::Test {
protected:
    void SetUp() override { renew(); }
    void TearDown() override { drop(); }
    void renew()
    {
        drop();
        fakes::reset();
        ASSERT_TRUE(_recorder.createHandle(&_model));
        calls.clear();
    }
    void drop()
    {
        calls.clear();
        _recorder.destroyHandle();
    }
    bool start() { return _recorder.start(_error); }
    void status(unsigned long long elapsed) { fakes::recorder.status(elapsed, 0, fakes::recorder.userData); }

    MwModel _model;
    MwRecorder _recorder;
    MwRecorder::ErrorType _error = MwRecorder::ERROR_NONE;
};

TEST_F(MwRecorderTest, StartStopsAtTheFirstFailingCall)
{
    _model.setEstimatedRecordingMaxTime(63);
    for (size_t i = 0; i < START_SEQUENCE.size(); ++i) {
        SCOPED_TRACE(START_SEQUENCE[i]);
        renew();
        calls.failWith(START_SEQUENCE[i], RECORDER_ERROR_INVALID_OPERATION);
        EXPECT_FALSE(start());
        EXPECT_EQ(MwRecorder::ERROR_UNKNOWN, _error);
        const auto made = calls.all();
        ASSERT_EQ(i + 1, made.size());
        for (size_t j = 0; j <= i; ++j)
            EXPECT_EQ(0u, made[j].find(START_SEQUENCE[j]));
    }
}

TEST_F(MwRecorderTest, StartUsesTheModelsSettings)
{
    EXPECT_TRUE(start());
    EXPECT_EQ(MwRecorder::ERROR_NONE, _error);
    EXPECT_FALSE(calls.has("recorder_attr_set_time_limit"));
    EXPECT_TRUE(calls.has("recorder_attr_set_audio_encoder_bitrate 288000"));
    EXPECT_TRUE(calls.has("recorder_attr_set_size_limit 4194304"));
    EXPECT_EQ(std::string(std::getenv("MEWLO_DEVICE_ROOT")) + "/.mw_temp", fakes::recorder.fileName);
    EXPECT_FALSE(start()) << "a running recorder is not started";
    EXPECT_TRUE(fakes::log.has("can't start in current fw state[3]"));
    renew();
    _model.setEstimatedRecordingMaxTime(1);
    _model.setAudioCodec(0);
    _model.setSampleRate(8000);
    EXPECT_TRUE(start());
    EXPECT_TRUE(calls.has("recorder_attr_set_time_limit 1"));
    EXPECT_TRUE(calls.has("recorder_set_audio_encoder 0"));
    EXPECT_TRUE(calls.has("recorder_attr_set_audio_samplerate 8000"));
}

TEST_F(MwRecorderTest, GuardsEveryStep)
{
    EXPECT_FALSE(_recorder.pause());
    EXPECT_FALSE(_recorder.resume(_error));
    EXPECT_FALSE(_recorder.cancel());
    ASSERT_TRUE(start());
    EXPECT_FALSE(_recorder.resume(_error));
    EXPECT_TRUE(_recorder.pause());
    EXPECT_FALSE(_recorder.pause());
    EXPECT_TRUE(_recorder.resume(_error));
    EXPECT_TRUE(_recorder.pause());
    EXPECT_TRUE(_recorder.cancel());
    EXPECT_EQ(RECORDER_STATE_CREATED, fakes::recorder.state);
    EXPECT_FALSE(_recorder.createHandle(&_model));
    EXPECT_TRUE(_recorder.destroyHandle());
    EXPECT_FALSE(_recorder.destroyHandle());
    EXPECT_FALSE(_recorder.pause() || _recorder.stop() || start());
    EXPECT_FALSE(_recorder.createHandle(nullptr));
}

TEST_F(MwRecorderTest, StopNeverHidesAFailedCommit)
{
    ASSERT_TRUE(start());
    EXPECT_TRUE(_recorder.stop());
    EXPECT_EQ(1u, calls.count("recorder_commit"));
    EXPECT_EQ(RECORDER_STATE_CREATED, fakes::recorder.state);
    fakes::recorder.state = RECORDER_STATE_READY; // completed by itself
    calls.clear();
    EXPECT_TRUE(_recorder.stop());
    EXPECT_FALSE(calls.has("recorder_commit"));
    EXPECT_TRUE(calls.has("recorder_unprepare"));
    for (const bool request : {false, true}) {
        fakes::recorder.state = RECORDER_STATE_RECORDING;
        _model.setRequestMode(request);
        calls.failWith("recorder_commit", -1);
        EXPECT_FALSE(_recorder.stop());
        calls.clear();
        calls.failWith("recorder_unprepare", -1);
        EXPECT_EQ(request, _recorder.stop()) << "the file is complete";
        calls.clear();
    }
}

TEST_F(MwRecorderTest, DestroyKeepsTheHandleUntilItIsUnwired)
{
    calls.failWith("recorder_unset_recording_status_cb", -1);
    EXPECT_FALSE(_recorder.destroyHandle());
    EXPECT_FALSE(calls.has("recorder_destroy"));
    calls.clear();
    fakes::recorder.state = RECORDER_STATE_READY;
    EXPECT_TRUE(_recorder.destroyHandle());
    EXPECT_TRUE(calls.has("recorder_unprepare"));
}

TEST_F(MwRecorderTest, LevelIsSampledOnEveryTenthStatus)
{
    ASSERT_TRUE(start());
    std::vector<int> sampled;
    for (int i = 1; i <= 30; ++i) {
        _model.setLevel(1.0);
        status(i == 1 ? 0 : static_cast<unsigned long long>(i) * 20);
        if (_model.getLevel() != 1.0)
            sampled.push_back(i);
    }
    EXPECT_EQ((std::vector<int>{10, 20, 30}), sampled);
    EXPECT_EQ(-15.0, _model.getLevel());
    EXPECT_EQ(600u, _model.getElapsedTime());
    for (int i = 0; i < 5; ++i)
        status(620);
    status(0); // counts from the beginning again
    calls.failWith("recorder_get_audio_level", -1);
    for (int i = 0; i < 8; ++i)
        status(20);
    EXPECT_EQ(-15.0, _model.getLevel());
    status(20);
    EXPECT_EQ(-300.0, _model.getLevel());
}

TEST_F(MwRecorderTest, ErrorsBecomeSignals)
{
    std::vector<int> errors;
    _recorder.errorSignal.addListener([&](MwRecorder::ErrorType type) { errors.push_back(type); });
    for (const int code : std::initializer_list<int>{RECORDER_ERROR_SECURITY_RESTRICTED,
             RECORDER_ERROR_SOUND_POLICY_BY_CALL, RECORDER_ERROR_SOUND_POLICY_BY_ALARM, RECORDER_ERROR_ESD,
             RECORDER_ERROR_OUT_OF_STORAGE, RECORDER_ERROR_DEVICE, 0, RECORDER_ERROR_STORAGE})
        fakes::recorder.error(code, RECORDER_STATE_RECORDING, fakes::recorder.userData);
    EXPECT_EQ((std::vector<int>{4, 3, 1, 1, 2, 1, 1, 5}), errors);
    fakes::recorder.interrupted(RECORDER_POLICY_NONE, RECORDER_STATE_READY, RECORDER_STATE_READY, nullptr);
    EXPECT_TRUE(fakes::log.has("self is nullptr"));
}

class MwPlayerTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        fakes::reset();
        _model.setCurrentPlayPath("/a.m4a");
    }
    MwModel _model;
    MwPlayer _player{&_model};
};

TEST_F(MwPlayerTest, StartFailuresLeaveNothingPlaying)
{
    _model.setCurrentPlayPath("");
    EXPECT_FALSE(_player.start());
    EXPECT_TRUE(fakes::log.has("current play path is empty!!!"));
    _model.setCurrentPlayPath("/a.m4a");
    for (const char* call : {"player_set_uri", "player_prepare", "player_start", "player_get_duration"}) {
        calls.clear();
        calls.failWith(call, PLAYER_ERROR_NOT_SUPPORTED_FILE);
        EXPECT_FALSE(_player.start()) << call;
        EXPECT_EQ(PLAY_STATE_NONE, _model.getPlayerState());
        const bool begun = std::string(call) == "player_start" || std::string(call) == "player_get_duration";
        EXPECT_EQ(begun, calls.has("player_destroy")) << call;
    }
    EXPECT_TRUE(fakes::log.has("PLAYER_ERROR_NOT_SUPPORTED_FILE"));
    calls.clear();
    calls.failWith("player_prepare", -1);
    EXPECT_FALSE(_player.start());
    const size_t created = calls.count("player_create");
    calls.clear();
    EXPECT_TRUE(_player.start());
    EXPECT_EQ(1u, created + calls.count("player_create")) << "the next start reuses the player";
}

TEST_F(MwPlayerTest, FollowsThePositionWhilePlaying)
{
    ASSERT_TRUE(_player.start());
    fakes::player.position = 700;
    EXPECT_TRUE(support::runUntil([&] { return _model.getCurrentPlayPosition() == 700; }));
    ASSERT_TRUE(_player.pause());
    EXPECT_EQ(PLAY_STATE_PAUSED, _model.getPlayerState());
    calls.clear();
    support::runFor(0.06);
    EXPECT_FALSE(calls.has("player_get_play_position"));
    EXPECT_TRUE(_player.setPlayPosition(5000));
    EXPECT_EQ(5000u, _model.getCurrentPlayPosition());
    EXPECT_TRUE(_player.isSeeking());
    fakes::player.seekCompleted(fakes::player.userData);
    EXPECT_FALSE(_player.isSeeking());
    calls.clear();
    EXPECT_TRUE(_player.resume());
    EXPECT_TRUE(calls.has("player_set_play_position 5000"));
    EXPECT_TRUE(_player.stop());
    EXPECT_EQ(0u, _model.getCurrentPlayPosition());
    EXPECT_FALSE(_player.isSeeking());
    EXPECT_FALSE(_player.pause() || _player.resume() || _player.stop() || _player.setPlayPosition(1));
}

TEST_F(MwPlayerTest, LongRecordingsArePolledLessOften)
{
    for (const auto& [duration, often] : std::map<int, bool>{{300000, true}, {300001, false}}) {
        fakes::player.duration = duration;
        ASSERT_TRUE(_player.start());
        calls.clear();
        support::runFor(0.15);
        EXPECT_EQ(often, calls.count("player_get_play_position") >= 1) << duration;
        _player.stop();
    }
}

TEST_F(MwPlayerTest, EndInterruptionAndErrorReachTheListeners)
{
    std::string heard;
    _player.getCompletedSignal().addListener([&] { heard += "c" + std::to_string(mwNumber(_model.getPlayerState())); });
    _player.getInterruptedSignal().addListener([&](player_interrupted_code_e code) {
        heard += "i" + std::to_string(code) + std::to_string(mwNumber(_model.getPlayerState()));
    });
    _player.getErrorSignal().addListener([&](MwPlayer::PlayerErrorType type) { heard += "e" + std::to_string(type); });
    ASSERT_TRUE(_player.start());
    fakes::player.completed(fakes::player.userData);
    EXPECT_EQ("c0", heard);
    ASSERT_TRUE(_player.start());
    fakes::player.state = PLAYER_STATE_PAUSED;
    fakes::player.interrupted(PLAYER_INTERRUPTED_BY_CALL, fakes::player.userData);
    fakes::player.state = PLAYER_STATE_READY;
    fakes::player.interrupted(PLAYER_INTERRUPTED_BY_RESOURCE_CONFLICT, fakes::player.userData);
    EXPECT_EQ("c0i22i40", heard);
    ASSERT_TRUE(_player.start());
    fakes::player.error(PLAYER_ERROR_DRM_EXPIRED, fakes::player.userData);
    EXPECT_EQ("c0i22i40e2", heard);
}

TEST(MwSoundSessionTest, RecordingSessionIsOpenedOnceAndSaysWhyNot)
{
    fakes::reset();
    {
        MwSoundSession session;
        EXPECT_TRUE(calls.has("sound_manager_set_media_session_option 1 0"));
        session.unsetRecordSoundSession();
        EXPECT_FALSE(calls.has("sound_manager_multi_session_destroy"));
        calls.failWith("sound_manager_multi_session_create", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL);
        EXPECT_EQ(MwSoundSession::SESSION_RESULT_FAILED, session.setRecordSoundSession());
        calls.clear();
        calls.failWith("sound_manager_multi_session_set_option", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_CALL);
        EXPECT_EQ(MwSoundSession::SESSION_RESULT_BLOCKED_BY_CALL, session.setRecordSoundSession());
        EXPECT_FALSE(calls.has("sound_manager_multi_session_set_mode"));
        calls.clear();
        calls.failWith("sound_manager_multi_session_set_mode", SOUND_MANAGER_ERROR_POLICY_BLOCKED_BY_ALARM);
        EXPECT_EQ(MwSoundSession::SESSION_RESULT_BLOCKED_BY_ALARM, session.setRecordSoundSession());
        EXPECT_FALSE(calls.has("sound_manager_multi_session_create")) << "the session stays";
        calls.clear();
        EXPECT_EQ(MwSoundSession::SESSION_RESULT_NONE, session.setRecordSoundSession());
        calls.failWith("sound_manager_multi_session_destroy", -1);
        session.unsetRecordSoundSession();
        calls.clear();
        session.unsetRecordSoundSession();
        EXPECT_EQ(1u, calls.count("sound_manager_multi_session_destroy")) << "a failed close is tried again";
        auto& lifeCycle = MwSignalMgr::getInstance()->getLifeCycleSignal();
        lifeCycle.emit(MwSignalMgr::RESUME);
        EXPECT_EQ(1u, calls.count("sound_manager_set_current_sound_type 4"));
        lifeCycle.emit(MwSignalMgr::PAUSE);
        lifeCycle.emit(MwSignalMgr::TERMINATE);
        EXPECT_EQ(2u, calls.count("sound_manager_unset_current_sound_type"));
        session.setRecordSoundSession();
        calls.clear();
    }
    EXPECT_TRUE(calls.has("sound_manager_multi_session_destroy"));
    MwSignalMgr::getInstance()->getLifeCycleSignal().emit(MwSignalMgr::RESUME);
    EXPECT_FALSE(calls.has("sound_manager_set_current_sound_type"));
}

}
