#include <gtest/gtest.h>
#include <preference.h>
#include <vconf.h>

#include <unistd.h>

#include "MwFeatureChecker.h"
#include "MwFiles.h"
#include "MwLaunchRequests.h"
#include "MwModel.h"
#include "MwRecordingNotes.h"
#include "MwRecordingRescue.h"
#include "MwRequestParser.h"
#include "MwSignalMgr.h"
#include "MwSystemMgr.h"
#include "MwText.h"
#include "fakes/Fakes.h"
#include "support/Recordings.h"
#include "support/RunUntil.h"

namespace {

using fakes::calls;

class MwSystemMgrTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        fakes::reset();
        ASSERT_EQ(0, media_content_connect());
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
        _system->initialize(&_model);
        _listener = MwSignalMgr::getInstance()->getSystemInfoSignal().addListener(
            [this](MwSignalMgr::SystemInfo info) { _events.push_back(info); });
        _system->registerEvent();
    }
    void TearDown() override
    {
        _system->unregisterEvent();
        _system->deinitialize();
        MwSignalMgr::getInstance()->getSystemInfoSignal().removeListener(_listener);
        MwSystemMgr::destroyInstance();
        media_content_disconnect();
        ::unsetenv("MEWLO_FREE_BYTES_DEVICE");
        ::unsetenv("MEWLO_FREE_BYTES_CARD");
    }
    // The events that a change of a key gives.
    std::vector<int> after(const char* key, int value)
    {
        support::runFor(0.05);
        _events.clear();
        vconf_set_int(key, value);
        support::runUntil([this] { return !_events.empty(); }, 0.3);
        return _events;
    }
    void free(const char* device, const char* card)
    {
        ::setenv("MEWLO_FREE_BYTES_DEVICE", device, 1);
        ::setenv("MEWLO_FREE_BYTES_CARD", card, 1);
    }

    MwModel _model;
    MwSystemMgr* _system = MwSystemMgr::getInstance();
    unsigned int _listener = 0;
    std::vector<int> _events;
};

TEST_F(MwSystemMgrTest, KeysBecomeEvents)
{
    using List = std::vector<int>;
    EXPECT_EQ(List{MwSignalMgr::LOCKSCREEN_CHANGED}, after(VCONFKEY_IDLE_LOCK_STATE, 1));
    EXPECT_TRUE(_system->isLockscreenOn());
    EXPECT_EQ(List{}, after(VCONFKEY_IDLE_LOCK_STATE, 2));
    EXPECT_EQ(List{MwSignalMgr::LOCKSCREEN_CHANGED}, after(VCONFKEY_IDLE_LOCK_STATE, 0));
    EXPECT_EQ(List{}, after(VCONFKEY_SYSMAN_POWER_OFF_STATUS, 1));
    EXPECT_EQ(List{MwSignalMgr::POWER_OFF}, after(VCONFKEY_SYSMAN_POWER_OFF_STATUS, 2));
    EXPECT_EQ(List{MwSignalMgr::POWER_OFF}, after(VCONFKEY_SYSMAN_POWER_OFF_STATUS, 3));
    EXPECT_EQ(List{}, after(VCONFKEY_SYSMAN_EARJACK, 1));
    EXPECT_EQ(List{MwSignalMgr::EARJACK_REMOVED}, after(VCONFKEY_SYSMAN_EARJACK, 0));
    EXPECT_EQ(List{MwSignalMgr::UPS_MODE_CHANGED}, after(VCONFKEY_SETAPPL_PSMODE, 7));
    EXPECT_EQ(List{MwSignalMgr::CALL_REJECT_CHANGED}, after(VCONFKEY_CALL_RECORDING_REJECT, 1));
    EXPECT_TRUE(_system->getRejectCall());
    EXPECT_EQ(List{}, after(VCONFKEY_MEWLO_MICROPHONE, 0));
    EXPECT_EQ(List{MwSignalMgr::MICROPHONE_BACK}, after(VCONFKEY_MEWLO_MICROPHONE, 1));
    fakes::sound.deviceChanged(SOUND_DEVICE_IN_MIC, SOUND_DEVICE_OUT_SPEAKER, fakes::sound.userData);
    _events.clear();
    std::thread([] {
        fakes::sound.deviceChanged(SOUND_DEVICE_IN_WIRED_ACCESSORY, SOUND_DEVICE_OUT_SPEAKER, fakes::sound.userData);
    }).join();
    EXPECT_TRUE(_events.empty()) << "not on the service's thread";
    EXPECT_TRUE(support::runUntil([&] { return _events == List{MwSignalMgr::EARJACK_INSERTED}; }));
}

TEST_F(MwSystemMgrTest, APulledCardGoesBackToTheDevice)
{
    EXPECT_TRUE(after(VCONFKEY_SYSMAN_MMC_STATUS, 1).empty());
    EXPECT_TRUE(_system->isMMCMounted());
    _model.setStorageType(MW_STORAGE_CARD);
    EXPECT_EQ(std::vector<int>{MwSignalMgr::MMC_REMOVED}, after(VCONFKEY_SYSMAN_MMC_STATUS, 2));
    EXPECT_EQ(MW_STORAGE_DEVICE, _model.getStorageChoice());
    EXPECT_EQ(std::vector<int>{MwSignalMgr::MMC_REMOVED}, after(VCONFKEY_SYSMAN_MMC_STATUS, 0));
}

TEST_F(MwSystemMgrTest, FullStoragesAreLeftForTheOther)
{
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    _model.setStorageType(MW_STORAGE_DEVICE);
    free("107521", "0");
    EXPECT_FALSE(_system->isStorageFull());
    EXPECT_FALSE(calls.has("post"));
    free("107520", "200000"); // exactly the threshold is full
    EXPECT_FALSE(_system->isStorageFull());
    EXPECT_EQ(mwTranslate("IDS_IDLE_TPOP_ITEMS_SAVED_TO_SD_CARD_INSTEAD_OF_DEFAULT_LOCATION_HDEVICE_STORAGE"),
        fakes::desktop.lastMessage);
    EXPECT_EQ(MW_STORAGE_CARD, _model.getStorageType());
    free("200000", "0");
    EXPECT_FALSE(_system->isStorageFull());
    EXPECT_EQ(MW_STORAGE_DEVICE, _model.getStorageType());
    free("107520", "107520");
    EXPECT_TRUE(_system->isStorageFull());
    EXPECT_EQ(MW_STORAGE_DEVICE, _model.getStorageType());
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
    free("0", "9000000");
    EXPECT_TRUE(_system->isStorageFull()) << "a card that is not mounted has no room";
}

TEST_F(MwSystemMgrTest, ForeignDatabaseChangesSettleIntoOneEvent)
{
    support::runFor(0.05);
    _events.clear();
    support::addRecording("own.m4a"); // of this process
    support::runFor(1.2);
    EXPECT_TRUE(_events.empty());
    for (int i = 0; i < 3; ++i) {
        support::writeFile(support::recordingPath("found" + std::to_string(i) + ".m4a"), "x");
        int added = 0;
        media_content_scan_folder(support::recordingsDirectory().c_str(), &added, nullptr);
        EXPECT_EQ(1, added);
        support::runFor(0.2);
    }
    EXPECT_TRUE(_events.empty());
    EXPECT_TRUE(support::runUntil([&] { return !_events.empty(); }));
    support::runFor(0.2);
    EXPECT_EQ(std::vector<int>{MwSignalMgr::MEDIA_DB_UPDATED}, _events);
}

TEST_F(MwSystemMgrTest, QueriesToleratFailingServices)
{
    fakes::desktop.liveCalls = 2;
    EXPECT_TRUE(_system->isCallConnected());
    calls.failWith("cm_get_call_status", -1);
    fakes::desktop.liveCalls = 0;
    EXPECT_FALSE(_system->isCallConnected());
    calls.failWith("cm_init", -1);
    EXPECT_FALSE(_system->isCallConnected());
    fakes::sound.route = SOUND_DEVICE_OUT_WIRED_ACCESSORY;
    EXPECT_TRUE(_system->isEarjackInserted());
    calls.failWith("sound_manager_get_active_route", -1);
    EXPECT_FALSE(_system->isEarjackInserted());
    EXPECT_TRUE(_system->isLCDOn());
    calls.failWith("device_power_wakeup", -1);
    EXPECT_FALSE(_system->releaseLockDisplayDim());
    EXPECT_FALSE(calls.has("device_power_release_lock 2"));
    calls.failWith("device_display_get_state", -1);
    EXPECT_TRUE(_system->releaseLockDisplayDim());
    _system->setRejectCall(false);
    EXPECT_FALSE(_system->getRejectCall());
}

TEST(MwFeatureCheckerTest, TrimDependsOnTheModel)
{
    for (const auto& [model, trims] :
        std::map<std::string, bool>{{"QX-A110H", false}, {"QX-A210H", true}, {"QX-A210F", true}, {"?", true}}) {
        ::setenv("MEWLO_MODEL", model.c_str(), 1);
        MwSystemMgr::destroyInstance(); // it remembers the model
        EXPECT_EQ(trims, MwFeatureChecker::isEnable(0)) << model;
        EXPECT_FALSE(MwFeatureChecker::isEnable(1));
    }
}

TEST(MwRequestParserTest, ReadsModeFormatAndLimit)
{
    struct {
        const char* operation;
        const char* mime;
        const char* size;
        bool request;
        int format;
        int rate;
        int limit;
    } const cases[] = {
        {nullptr, nullptr, nullptr, false, 1, 44100, 4194304},
        {APP_CONTROL_OPERATION_CREATE_CONTENT, nullptr, "3", true, 1, 44100, 3},
        {APP_CONTROL_OPERATION_CREATE_CONTENT, "audio/AMR", "100", true, 2, 8000, 100},
        {APP_CONTROL_OPERATION_CREATE_CONTENT "x", "audio/x-amr-nb", "-5", false, 2, 8000, -5},
        {APP_CONTROL_OPERATION_MAIN, "audio/mp4", "abc", false, 1, 44100, 0},
        {APP_CONTROL_OPERATION_MAIN, "audio/Amr", "99999999999999999999", false, 1, 44100, 2147483647},
    };
    MwModel model;
    for (const auto& c : cases) {
        app_control_h request = fakes::makeRequest(c.operation, c.mime, c.size);
        EXPECT_TRUE(MwRequestParser().parse(request, &model));
        EXPECT_EQ(c.request, model.isRequestMode()) << (c.operation ? c.operation : "none");
        EXPECT_EQ(c.format, model.getFileFormat());
        EXPECT_EQ(c.rate, model.getSampleRate());
        EXPECT_EQ(c.format == 2 ? 12200 : 288000, model.getBitRate());
        EXPECT_EQ(c.limit, model.getSizeLimit());
        EXPECT_FALSE(MwRequestParser().parse(request, nullptr) || MwRequestParser().parse(nullptr, &model));
        app_control_destroy(request);
    }
}

TEST(MwLaunchRequestsTest, ATakeKeepsModeFormatAndRequest)
{
    constexpr auto CREATE = APP_CONTROL_OPERATION_CREATE_CONTENT;
    using Result = MwLaunchRequests::Result;
    struct {
        const char* name;
        bool serves; // during a take for a request
        const char* operation;
        const char* size;
        Result result;
        bool answered;
        const char* error;
        bool requestModeAfterwards;
    } const cases[] = {
        {"the icon is clicked", false, APP_CONTROL_OPERATION_MAIN, nullptr, Result::IGNORED, false, "", false},
        {"the icon is clicked while another waits", true, APP_CONTROL_OPERATION_MAIN, nullptr, Result::IGNORED, false,
            "", true},
        {"too small", false, CREATE, "2", Result::REFUSED, true, "min_size_error", false},
        {"one recording", false, CREATE, "300", Result::WAITS, false, "", true},
        {"one recording while another waits", true, CREATE, "300", Result::REFUSED, true, "", true},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.name);
        MwModel model;
        MwLaunchRequests requests(model);
        app_control_h first = fakes::makeRequest(c.serves ? CREATE : APP_CONTROL_OPERATION_MAIN, "audio/AMR", "500");
        ASSERT_EQ(Result::TAKEN, requests.receive(first));
        const app_control_h served = model.getRequestHandle();
        model.setAnswerPath("/saved.amr");
        model.holdStorage();
        fakes::reset();
        app_control_h second = fakes::makeRequest(c.operation, "audio/mp4", c.size);
        EXPECT_EQ(c.result, requests.receive(second));
        EXPECT_EQ(c.answered, calls.has("app_control_reply_to_launch_request"));
        EXPECT_EQ(c.error, fakes::reply.extras["error"]);
        requests.recorderUpdated();
        EXPECT_EQ(c.serves, model.isRequestMode()) << "as long as the take lasts";
        EXPECT_EQ(500, model.getSizeLimit());
        EXPECT_EQ(MwModel::FORMAT_AMR, model.getFileFormat());
        EXPECT_EQ(served, model.getRequestHandle());
        model.releaseStorage();
        requests.recorderUpdated();
        EXPECT_EQ(c.requestModeAfterwards, model.isRequestMode());
        EXPECT_EQ(c.result == Result::WAITS ? 300 : 500, model.getSizeLimit());
        EXPECT_EQ(c.result == Result::WAITS ? "" : "/saved.amr", model.getAnswerPath())
            << "an answer is for its own request";
        app_control_destroy(first);
        app_control_destroy(second);
    }
}

class MwRecordingRescueTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        fakes::reset();
        std::filesystem::remove_all(support::deviceRoot());
        std::filesystem::create_directories(support::deviceRoot());
        ASSERT_EQ(0, media_content_connect());
    }
    void TearDown() override { media_content_disconnect(); }
    // The service reports one rebuilt file with these notes.
    void leave(const std::string& content, const std::optional<MwRecordingNotes::Content>& notes,
        recorder_file_format_e format)
    {
        const std::string file = support::deviceRoot() + "/.mw_rescue_1";
        support::writeFile(file, content);
        const std::string sidecar = file + ".notes";
        if (notes)
            MwRecordingNotes::save(sidecar, *notes);
        fakes::recorder.onRescue = [=](const char*, recorder_leftover_cb callback, void* data) {
            callback(RECORDER_LEFTOVER_REBUILT, file.c_str(), format, 1000, notes ? sidecar.c_str() : nullptr, data);
            return 1;
        };
    }
    int bookmarksOf(const std::string& path)
    {
        _model.createRecordedFileList();
        const MwFileInfo* info = _model.getRecordedFileInfoByPath(path);
        int count = -1;
        if (info != nullptr)
            media_info_get_bookmark_count_from_db(info->mediaId.c_str(), nullptr, &count);
        return count;
    }
    MwModel _model;
};

TEST_F(MwRecordingRescueTest, ALeftoverBecomesAnOrdinaryRecording)
{
    support::addRecording("Talk.amr", "mine");
    leave("rebuilt", MwRecordingNotes::Content{"Talk", {{0, 1, "a"}, {1, 2, "b"}}}, RECORDER_FILE_FORMAT_AMR);
    EXPECT_EQ(std::vector<std::string>{"Talk_001.amr"}, MwRecordingRescue::run(_model));
    EXPECT_EQ("mine", support::readFile(support::recordingPath("Talk.amr")));
    EXPECT_EQ("rebuilt", support::readFile(support::recordingPath("Talk_001.amr")));
    EXPECT_EQ(2, bookmarksOf(support::recordingPath("Talk_001.amr")));
    EXPECT_FALSE(std::filesystem::exists(support::deviceRoot() + "/.mw_rescue_1.notes"));
    EXPECT_TRUE(calls.has("post"));

    const std::string longest(251, 'n'); // leaves no room for a counter
    support::addRecording(longest + ".amr", "mine");
    leave("rebuilt", MwRecordingNotes::Content{longest, {}}, RECORDER_FILE_FORMAT_AMR);
    EXPECT_EQ(1u, MwRecordingRescue::run(_model).size());
}

TEST_F(MwRecordingRescueTest, HostileOrMissingNotesGetADefaultName)
{
    for (const char* name : {"../../evil", "", ".hidden"}) {
        leave("rebuilt", MwRecordingNotes::Content{name, {}}, RECORDER_FILE_FORMAT_MP4);
        const auto names = MwRecordingRescue::run(_model);
        ASSERT_EQ(1u, names.size());
        EXPECT_EQ(0u, names[0].find(mwTranslate("IDS_MW_BODY_DEFAULTNAME_VOICE"))) << name;
        EXPECT_TRUE(std::filesystem::exists(support::recordingPath(names[0])));
    }
    leave("rebuilt", std::nullopt, RECORDER_FILE_FORMAT_MP4);
    EXPECT_EQ(1u, MwRecordingRescue::run(_model).size());
}

TEST_F(MwRecordingRescueTest, CataloguesUnknownFilesAndWaitingBookmarks)
{
    const std::string path = support::recordingPath("copied.m4a");
    support::writeFile(path, "x");
    MwRecordingNotes::save(MwRecordingNotes::pathForSaved(path), {"copied", {{0, 4, "here"}}});
    support::writeFile(support::recordingPath(".gone.m4a.notes"), "[recording]\nname=gone\n");
    for (int run = 0; run < 2; ++run) {
        EXPECT_TRUE(MwRecordingRescue::run(_model).empty());
        EXPECT_EQ(1, bookmarksOf(path));
        EXPECT_FALSE(std::filesystem::exists(MwRecordingNotes::pathForSaved(path)));
        EXPECT_FALSE(std::filesystem::exists(support::recordingPath(".gone.m4a.notes")));
    }
    std::filesystem::remove(path);
    MwRecordingRescue::run(_model);
    EXPECT_EQ(-1, bookmarksOf(path)) << "a row whose file is gone goes too";
}

TEST(MwFilesTest, NeverOverwrites)
{
    const support::TempDir directory;
    support::writeFile(directory.file("a"), "new");
    support::writeFile(directory.file("b"), "old");
    EXPECT_EQ(MwFiles::Move::EXISTS, MwFiles::moveWithoutOverwriting(directory.file("a"), directory.file("b")));
    EXPECT_EQ("old", support::readFile(directory.file("b")));
    EXPECT_EQ(MwFiles::Move::DONE, MwFiles::moveWithoutOverwriting(directory.file("a"), directory.file("c")));
    EXPECT_EQ("new", support::readFile(directory.file("c")));
    EXPECT_EQ(MwFiles::Move::FAILED, MwFiles::moveWithoutOverwriting(directory.file("a"), directory.file("d")));
}

}
