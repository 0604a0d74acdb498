#include "MwRecordingRescue.h"

#include <Ecore_File.h>
#include <media_content.h>
#include <notification.h>
#include <recorder_leftover.h>

#include <filesystem>
#include <optional>

#include "MwFileName.h"
#include "MwFilePlaces.h"
#include "MwFiles.h"
#include "MwHandle.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwMoveRecord.h"
#include "MwRecordingNotes.h"
#include "MwSavedBookmarks.h"
#include "MwStagedFile.h"
#include "MwStorageRoots.h"
#include "MwSystemMgr.h"
#include "MwText.h"
#include "MwTrimStore.h"

namespace {

using Media = MwHandle<media_info_h, media_info_destroy>;

struct Work {
    MwModel* model;
    std::string root;
    std::vector<std::string> rescued;
    int beyondRescue = 0;
};

// Moves a rebuilt file to a name of its own in the recordings directory; nothing when that is impossible.
std::optional<std::string> place(
    const std::string& file, const std::string& directory, const std::string& name, const char* extension)
{
    std::string path = mwFormat("%s/%s%s", directory.c_str(), name.c_str(), extension);
    for (;;) {
        switch (MwFiles::moveWithoutOverwriting(file, path)) {
        case MwFiles::Move::DONE:
            MwFiles::flushDirectoryOf(path);
            MwFiles::flushDirectoryOf(file);
            return path;
        case MwFiles::Move::FAILED:
            return std::nullopt;
        case MwFiles::Move::EXISTS:
            path = MwFilePlaces::freePath(mwFormat("%s%s", name.c_str(), extension), directory);
        }
    }
}

bool catalogue(const std::string& path, const std::vector<MwBookmark>& bookmarks)
{
    Media media;
    char* id = nullptr;
    if (!MW_CALL(media_info_insert_to_db, path.c_str(), media.out())
        || !MW_CALL(media_info_get_media_id, media.get(), &id))
        return false;
    const std::string mediaId = mwAdopt(id);
    return MW_CALL(mwInsertBookmarks, mediaId, bookmarks);
}

void leftoverCb(recorder_leftover_e outcome, const char* file, recorder_file_format_e format, int duration,
    const char* sidecar, void* userData)
{
    auto* work = static_cast<Work*>(userData);
    if (outcome == RECORDER_LEFTOVER_BEYOND_RESCUE)
        ++work->beyondRescue;
    if (outcome != RECORDER_LEFTOVER_REBUILT)
        return;
    MW_LOGI("rebuilt a recording of %d ms", duration);
    std::optional<MwRecordingNotes::Content> notes;
    if (sidecar != nullptr)
        notes = MwRecordingNotes::load(sidecar);
    work->model->updateLastRecordedFileNumber();
    const std::string name
        = notes && mwIsFileName(notes->name, ".amr") ? notes->name : work->model->getDefaultRecordingFileName();
    const char* extension = format == RECORDER_FILE_FORMAT_AMR ? ".amr" : ".m4a";
    const std::string directory = MwFilePlaces::directoryBelow(work->root);
    if (!MwFiles::makeDirectories(directory))
        return;
    const auto path = place(file, directory, name, extension);
    if (!path)
        return; // still under its hidden name: the next start tries again
    const std::vector<MwBookmark> bookmarks = notes ? notes->bookmarks : std::vector<MwBookmark>();
    if (!catalogue(*path, bookmarks) && notes)
        MwRecordingNotes::save(MwRecordingNotes::pathForSaved(*path), *notes);
    if (sidecar != nullptr)
        MwRecordingNotes::remove(sidecar);
    work->rescued.push_back(ecore_file_file_get(path->c_str()));
}

// Notes that wait beside a saved recording because its row could not be written at the time.
void catalogueWaitingNotes(const std::string& directory)
{
    const std::string suffix = RECORDER_NOTES_SUFFIX;
    std::error_code error;
    std::vector<std::string> found;
    for (auto entry = std::filesystem::directory_iterator(directory, error);
         !error && entry != std::filesystem::directory_iterator(); entry.increment(error)) {
        const std::string name = entry->path().filename().string();
        if (name.size() > suffix.size() + 1 && name.front() == '.' && name.ends_with(suffix))
            found.push_back(name);
    }
    for (const std::string& name : found) {
        const std::string recording = directory + "/" + name.substr(1, name.size() - suffix.size() - 1);
        const std::string notesPath = directory + "/" + name;
        const auto notes = MwRecordingNotes::load(notesPath);
        const bool pointless = !notes || ecore_file_exists(recording.c_str()) == EINA_FALSE;
        if (pointless || catalogue(recording, notes->bookmarks))
            MwRecordingNotes::remove(notesPath);
    }
}

// Moves and trims that a crash has cut off.
void finishInterrupted(const std::string& directory)
{
    MwStagedFile::sweep(directory);
    MwMoveRecord::recover(directory);
    MwTrimStore::recover(directory);
}

std::string tellRescued(const std::vector<std::string>& names)
{
    std::string text = mwTranslate("IDS_MW_TPOP_RECORDING_RESCUED_PS");
    if (const size_t place = text.find("%s"); place != std::string::npos)
        text.replace(place, 2, names.back());
    return text;
}

}

MwRecordingRescue::MwRecordingRescue(MwModel& model)
    : _model(model)
{
}

MwRecordingRescue::~MwRecordingRescue()
{
    if (_thread.joinable())
        _thread.join();
}

void MwRecordingRescue::start()
{
    _thread = std::thread([this] { run(_model); });
}

std::vector<std::string> MwRecordingRescue::run(MwModel& model)
{
    Work work{&model, {}, {}, 0};
    std::vector<std::string> roots = {mwDeviceRoot()};
    if (MwSystemMgr::getInstance()->isMMCMounted())
        roots.push_back(mwCardRoot());
    for (const std::string& root : roots) {
        work.root = root;
        const std::string temporary = mwFormat("%s/%s", root.c_str(), TEMP_FILE_NAME);
        if (const int found = recorder_rescue_leftovers(temporary.c_str(), leftoverCb, &work); found < 0)
            MW_LOGE("recorder_rescue_leftovers failed : [%d]!!!", found);
        catalogueWaitingNotes(MwFilePlaces::directoryBelow(root));
        finishInterrupted(MwFilePlaces::directoryBelow(root));
    }
    finishInterrupted(MwFilePlaces::directoryBelow(mwPrivateRoot()));
    MW_CALL(media_content_scan_all);
    if (!work.rescued.empty())
        notification_status_message_post(tellRescued(work.rescued).c_str());
    else if (work.beyondRescue > 0)
        mwPost("IDS_MW_TPOP_RECORDING_BEYOND_RESCUE_KEPT");
    return work.rescued;
}
