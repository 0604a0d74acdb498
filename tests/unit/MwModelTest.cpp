#include <sys/wait.h>
#include <unistd.h>

#include "MwModel.h"

#include <gtest/gtest.h>
#include <preference.h>
#include <vconf.h>

#include <filesystem>
#include <sys/stat.h>

#include "MwFiles.h"
#include "MwRecordingNotes.h"
#include "MwText.h"
#include "fakes/Fakes.h"
#include "support/Amr.h"
#include "support/Recordings.h"
#include "support/TempDir.h"

namespace {

using support::addRecording;

class MwModelTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        fakes::reset();
        std::filesystem::remove_all(support::deviceRoot() + "/Sounds");
        ASSERT_EQ(0, media_content_connect());
    }
    void TearDown() override { media_content_disconnect(); }

    std::string base() const { return mwTranslate("IDS_MW_BODY_DEFAULTNAME_VOICE"); }
    // The default name after these recordings were listed, without the base word.
    std::string nextAfter(const std::vector<std::string>& listed)
    {
        for (const std::string& name : listed)
            addRecording(name);
        _model.updateLastRecordedFileNumber();
        std::string name = _model.getDefaultRecordingFileName();
        return name.substr(name.find(base()) + base().size());
    }

    MwModel _model;
};

// One case in a database of its own: ctest runs each in its own process, a plain run shares one database.
struct Numbering {
    const char* name;
    const char* listed;
    const char* next;
};

class MwModelNumberingTest : public MwModelTest, public ::testing::WithParamInterface<Numbering> { };

TEST_P(MwModelNumberingTest, NextNumberFollowsTheListedNames)
{
    std::string listed = GetParam().listed;
    for (size_t place = listed.find('B'); place != std::string::npos; place = listed.find('B', place + base().size()))
        listed.replace(place, 1, base());
    const std::string id = addRecording(listed);
    std::filesystem::remove(support::recordingPath(listed)); // the counter comes from the row, not from the file
    EXPECT_EQ(GetParam().next, nextAfter({}));
    media_info_delete_from_db(id.c_str());
}

INSTANTIATE_TEST_SUITE_P(Names, MwModelNumberingTest,
    ::testing::Values(Numbering{"plain", "B 005.m4a", " 006"}, Numbering{"two_blanks", "B  012.m4a", " 013"},
        Numbering{"no_blank", "B012.m4a", " 013"}, Numbering{"dash", "B-3.m4a", " 001"},
        Numbering{"inside", "My B 3.amr", " 004"}, Numbering{"sub", "B 7(2).m4a", " 008"},
        Numbering{"letters", "B 7(x).m4a", " 001"}, Numbering{"suffix", "B 7x.m4a", " 001"},
        Numbering{"nothing", "B .m4a", " 001"}, Numbering{"empty_sub", "B 7().m4a", " 008"},
        Numbering{"other", "Song 9.m4a", " 001"}, Numbering{"capped", "B 99999999999.m4a", " 001(1)"},
        Numbering{"highest", "B 4294967295.m4a", " 001(1)"},
        Numbering{"sub_of_highest", "B 4294967295(7).m4a", " 4294967295(8)"}),
    [](const auto& param) { return std::string(param.param.name); });

TEST_F(MwModelTest, NamesSkipExistingFilesAndNeverGoBack)
{
    support::writeFile(support::recordingPath(base() + " 006.m4a"), "unlisted");
    EXPECT_EQ(" 007", nextAfter({base() + " 001.m4a", base() + " 005.m4a"}));
    EXPECT_TRUE(_model.checkRecordFileNameExist(base() + " 006"));
    _model.setFileFormat(MwModel::FORMAT_AMR); // changes only the probe
    EXPECT_FALSE(_model.checkRecordFileNameExist(base() + " 006"));
    EXPECT_EQ(base() + " 006", _model.getDefaultRecordingFileName());
    _model.updateNextRecordingFileName();
    _model.updateNextRecordingFileName();
    EXPECT_EQ(base() + " 007", _model.getCurrentRecordingFileName());
    _model.windBackRecordingFileName();
    EXPECT_FALSE(_model.checkRecordFileNameExist(_model.getCurrentRecordingFileName()));
    _model.updateNextRecordingFileName();
    EXPECT_EQ(base() + " 007", _model.getCurrentRecordingFileName());
}

TEST_F(MwModelTest, ListsNewestFirstAndPlaysAround)
{
    const char* names[] = {"oldest.amr", "middle.m4a", "newest.m4a"};
    auto time = std::filesystem::file_time_type::clock::now() - std::chrono::hours(3);
    std::vector<std::string> ids;
    for (const char* name : names) {
        support::writeFile(support::recordingPath(name), "x");
        std::filesystem::last_write_time(support::recordingPath(name), time += std::chrono::hours(1));
        media_info_h media = nullptr;
        ASSERT_EQ(0, media_info_insert_to_db(support::recordingPath(name).c_str(), &media));
        media_info_destroy(media);
    }
    ASSERT_TRUE(_model.createRecordedFileList());
    std::vector<std::string> listed;
    for (const MwFileInfo& info : _model.getRecordedFileList()) {
        if (std::find(std::begin(names), std::end(names), info.displayName) != std::end(names))
            listed.push_back(info.displayName);
    }
    EXPECT_EQ((std::vector<std::string>{"newest.m4a", "middle.m4a", "oldest.amr"}), listed);

    _model.setCurrentPlayPath(_model.getRecordedFileList().back().path);
    EXPECT_EQ(_model.getRecordedFileList().front().path, _model.getNextPlayPath());
    _model.setCurrentPlayPath(_model.getRecordedFileList().front().path);
    EXPECT_EQ(_model.getRecordedFileList().back().path, _model.getPreviousPlayPath());
    EXPECT_EQ(_model.getRecordedFileList()[1].path, _model.getNextPlayPath());
    _model.setCurrentPlayPath("/nowhere.m4a");
    EXPECT_EQ(std::nullopt, _model.getNextPlayPath());
    EXPECT_EQ(std::nullopt, _model.getPreviousPlayPath());
    _model.destroyRecordedFileList();
    EXPECT_EQ(std::nullopt, _model.getNextPlayPath());
}

TEST_F(MwModelTest, HostilePathsTouchNoOtherRow)
{
    const std::string hostile = "x\" OR \"1\"=\"1 %d ';--.m4a";
    addRecording("innocent.m4a");
    ASSERT_NE("", addRecording(hostile));
    _model.setCurrentPlayPath(support::recordingPath(hostile));
    fakes::log.clear();
    EXPECT_EQ(0u, _model.getCurrentPlayDuration());
    EXPECT_FALSE(fakes::log.has("foreach_media_from_db failed"));
    _model.createRecordedFileList();
    EXPECT_NE(nullptr, _model.getRecordedFileInfoByPath(support::recordingPath(hostile)));
    for (const auto& [name, frames] : {std::pair{"Case.amr", 50}, {"case.amr", 100}, {"CASE.amr", 150}}) {
        addRecording(name, support::wideAmr(frames));
        _model.setCurrentPlayPath(support::recordingPath(name));
        EXPECT_EQ(frames * 20U, _model.getCurrentPlayDuration()) << name;
    }
}

TEST_F(MwModelTest, BookmarksAreLimitedUniqueAndKeptBesideTheRecording)
{
    unsigned int marked = 99;
    for (unsigned int i = 0; i < 50; ++i) {
        _model.setElapsedTime(i * 1000 + 999);
        ASSERT_TRUE(_model.addBookMark(marked)) << i;
        EXPECT_EQ(i, marked);
    }
    _model.setElapsedTime(50000);
    EXPECT_FALSE(_model.addBookMark(marked));
    EXPECT_TRUE(fakes::log.has("Max book mark count reached!!"));
    const auto notes = MwRecordingNotes::load(MwRecordingNotes::pathFor(_model.getTemporaryFilePath()));
    ASSERT_TRUE(notes);
    ASSERT_EQ(50u, notes->bookmarks.size());
    EXPECT_EQ(_model.getBookmarkList()[49].name, notes->bookmarks[49].name);
    EXPECT_EQ(mwTranslate("IDS_MW_BODY_BOOKMARK") + "050", notes->bookmarks[49].name);

    const std::string id = addRecording("marked.m4a");
    EXPECT_TRUE(_model.saveBookMark(id.c_str()));
    int count = 0;
    media_info_get_bookmark_count_from_db(id.c_str(), nullptr, &count);
    EXPECT_EQ(50, count);
    EXPECT_TRUE(_model.getBookmarkList().empty());

    _model.setElapsedTime(1500);
    EXPECT_TRUE(_model.addBookMark(marked));
    _model.setElapsedTime(1999);
    EXPECT_FALSE(_model.addBookMark(marked));
    EXPECT_EQ(mwTranslate("IDS_MW_TPOP_ALREADY_ADDED_TO_BOOKMARKS"), fakes::desktop.lastMessage);
}

TEST_F(MwModelTest, NotesSurviveHostileNamesAndDamage)
{
    const std::string path = support::deviceRoot() + "/notes";
    const MwRecordingNotes::Content content{"a=b; [c]\n\"d\" \xC3\xA9", {{0, 7, "x=\n7"}, {1, 8, ""}}};
    ASSERT_TRUE(MwRecordingNotes::save(path, content));
    const auto loaded = MwRecordingNotes::load(path);
    ASSERT_TRUE(loaded);
    EXPECT_EQ(content.name, loaded->name);
    ASSERT_EQ(2u, loaded->bookmarks.size());
    EXPECT_EQ("x=\n7", loaded->bookmarks[0].name);
    EXPECT_EQ(8u, loaded->bookmarks[1].markedTime);
    support::writeFile(path, "no key file \xff");
    EXPECT_FALSE(MwRecordingNotes::load(path));
    EXPECT_FALSE(MwRecordingNotes::save("/nonexistent/notes", content));
}

TEST_F(MwModelTest, NotesAreTheOwnersAndFollowNoLink)
{
    const std::string path = support::deviceRoot() + "/.mw_temp.notes";
    const std::string victim = support::deviceRoot() + "/victim";
    const MwRecordingNotes::Content content{"mine", {}};
    const mode_t before = umask(0);
    for (const mode_t mask : {0000, 0777}) {
        for (const char* planted : {"~", ""}) {
            support::writeFile(victim, "[recording]\nname=theirs\n");
            std::filesystem::remove(path);
            std::filesystem::create_symlink(victim, path + planted);
            umask(mask);
            EXPECT_FALSE(MwRecordingNotes::load(path)) << "what a link leads to is not ours";
            EXPECT_TRUE(MwRecordingNotes::save(path, content));
            umask(0);
            EXPECT_EQ("[recording]\nname=theirs\n", support::readFile(victim));
            EXPECT_EQ("mine", MwRecordingNotes::load(path)->name);
            struct stat status { };
            EXPECT_EQ(0, lstat(path.c_str(), &status));
            EXPECT_EQ(S_IFREG | 0600u, status.st_mode);
            std::filesystem::remove(victim);
        }
    }
    umask(before);
    std::filesystem::remove(path);
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    EXPECT_FALSE(MwRecordingNotes::load(path)) << "and a pipe holds nobody";
    std::filesystem::remove(path);
}

TEST_F(MwModelTest, FoldersAreOpenToAllOnlyBelowASharedPlace)
{
    const support::TempDir directory;
    const mode_t before = umask(027);
    for (const auto& [root, made] : std::map<mode_t, mode_t>{{0700, 0750}, {0755, 0750}, {0777, 0777}, {01777, 0777}}) {
        ASSERT_EQ(0, chmod(directory.file("").c_str(), root));
        EXPECT_TRUE(MwFiles::makeDirectories(directory.file("Sounds/Mewlo")));
        for (const char* name : {"Sounds", "Sounds/Mewlo"}) {
            struct stat status { };
            EXPECT_EQ(0, stat(directory.file(name).c_str(), &status));
            EXPECT_EQ(made, status.st_mode & 07777) << name << std::oct << " below " << root;
        }
        std::filesystem::remove_all(directory.file("Sounds"));
    }
    umask(before);
}

TEST_F(MwModelTest, StorageFollowsTheCardAndTheChoice)
{
    _model.setStorageType(MW_STORAGE_CARD);
    EXPECT_EQ(MW_STORAGE_DEVICE, _model.getStorageType()) << "no card key";
    for (const auto& [card, type] : std::map<int, int>{{0, 0}, {1, 1}, {2, 0}}) {
        vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, card);
        EXPECT_EQ(type, _model.getStorageType()) << card;
    }
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 1);
    EXPECT_EQ(std::string(std::getenv("MEWLO_CARD_ROOT")) + "/.mw_temp", _model.getTemporaryFilePath());
    _model.setFileFormat(MwModel::FORMAT_AMR);
    EXPECT_EQ(std::string(std::getenv("MEWLO_CARD_ROOT")) + "/Sounds/Mewlo/n.amr", _model.getRecordingPath("n"));
    vconf_set_int(VCONFKEY_SYSMAN_MMC_STATUS, 0);
}

TEST_F(MwModelTest, PublishesItsStateUnlessItServesARequest)
{
    int published = -1;
    _model.setRecorderState(REC_STATE_RECORDING);
    ASSERT_EQ(0, preference_get_int("MainRecordingState", &published));
    EXPECT_EQ(2, published);
    EXPECT_TRUE(MwModel::isMainInstanceRecording());
    const pid_t another = ::fork();
    if (another == 0) {
        MwModel().setRecorderState(REC_STATE_RECORDING);
        ::_exit(MwModel::isMainInstanceRecording() ? 0 : 1);
    }
    int status = 1;
    ::waitpid(another, &status, 0);
    EXPECT_EQ(0, status);
    EXPECT_FALSE(MwModel::isMainInstanceRecording()) << "its owner is gone";
    preference_set_int("MainRecordingProcess", ::getpid()); // the number again, for another process
    EXPECT_FALSE(MwModel::isMainInstanceRecording());
    _model.setRecorderState(REC_STATE_READY);
    EXPECT_FALSE(MwModel::isMainInstanceRecording());
    _model.setRecorderState(REC_STATE_RECORDING);
    _model.setRequestMode(true);
    _model.setRecorderState(REC_STATE_PAUSED);
    preference_get_int("MainRecordingState", &published);
    EXPECT_EQ(2, published);
    EXPECT_EQ(REC_STATE_PAUSED, _model.getRecorderState());

    vconf_set_int(VCONFKEY_MEWLO_RECORDER_STATE, 2); // of another instance
    MwModel guest;
    guest.setRequestMode(true);
    for (const auto& [state, shown] :
        std::vector<std::pair<int, int>>{{1, 2}, {0, 2}, {2, 2}, {3, 3}, {1, 1}, {0, 1}}) {
        guest.setRecorderState(static_cast<MwRecorderState>(state));
        vconf_get_int(VCONFKEY_MEWLO_RECORDER_STATE, &published);
        EXPECT_EQ(shown, published) << state;
    }
}

TEST_F(MwModelTest, DurationTexts)
{
    EXPECT_EQ("59:59", MwModel::getDurationText(3599999, false));
    EXPECT_EQ("00:59:59", MwModel::getDurationText(3599999, true));
    EXPECT_EQ("01:00:00", MwModel::getDurationText(3600000, false));
    EXPECT_EQ("00:00", MwModel::getDurationText(999, false));
    EXPECT_EQ("26:03:04", MwModel::getDurationText((26 * 3600 + 3 * 60 + 4) * 1000, true));
}

}
