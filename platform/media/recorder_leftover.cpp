#include <recorder_leftover.h>

#include "media/FileDescriptor.h"
#include "media/FileDuration.h"
#include "media/RecordingClaims.h"
#include "media/RecordingRebuild.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <set>
#include <string>

using namespace media;

namespace {

struct Report {
    recorder_leftover_cb callback;
    void* userData;

    void operator()(recorder_leftover_e outcome, const std::string& path, recorder_file_format_e format) const
    {
        const std::string notes = path + RECORDER_NOTES_SUFFIX;
        const bool hasNotes = access(notes.c_str(), F_OK) == 0;
        if (callback != nullptr)
            callback(outcome, path.c_str(), format, durationOf(path).value_or(0), hasNotes ? notes.c_str() : nullptr,
                userData);
    }
};

void removeGroup(const std::string& path)
{
    (void)unlink(path.c_str());
    (void)unlink((path + RECORDER_NOTES_SUFFIX).c_str());
    (void)unlink((path + JOURNAL_SUFFIX).c_str()); // last: it is the lock
}

// Brings the temporary file of a dead process under a rescue name. Leaves alone what a live one holds, ourselves
// included.
void moveTemporaryAside(const std::string& path)
{
    const bool isThere = access(path.c_str(), F_OK) == 0;
    const bool hasJournal = access((path + JOURNAL_SUFFIX).c_str(), F_OK) == 0;
    if (!isThere && !hasJournal)
        return;
    const FileDescriptor journal(openLocked(path + JOURNAL_SUFFIX));
    if (!journal)
        return;
    if (hasLeftover(path, journal.get()))
        (void)moveAside(path, journal.get());
    else
        removeGroup(path); // what is left of a recording that was saved
}

// While another process moves a recording its journal still lies at the old place and names the new one.
bool isBeingMoved(const std::string& temporaryPath, const std::string& group)
{
    if (access((group + JOURNAL_SUFFIX).c_str(), F_OK) == 0)
        return false;
    const FileDescriptor journal(
        open((temporaryPath + JOURNAL_SUFFIX).c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
    const auto header = journal ? readJournalHeader(journal.get()) : std::nullopt;
    return header && header->rescueId != 0 && rescueName(temporaryPath, header->rescueId) == group;
}

// The recordings moved aside in a directory, without their companions' suffixes.
std::set<std::string> rescueGroups(const std::string& directory)
{
    std::set<std::string> groups;
    for (const auto& file : filesWithPrefix(directory, RESCUE_PREFIX)) {
        const size_t suffix = file.find('.', file.rfind('/') + 2);
        groups.insert(file.substr(0, suffix));
    }
    return groups;
}

void setDamagedAside(const std::string& path, recorder_file_format_e format, const Report& report)
{
    const std::string prefix = directoryOf(path) + "/";
    const std::string newPath = prefix + DAMAGED_PREFIX + nameOf(path).substr(std::string(RESCUE_PREFIX).size());
    if (renameGroup(path, newPath) == 0)
        report(RECORDER_LEFTOVER_BEYOND_RESCUE, newPath, format);
}

// The application has moved a rebuilt file away by now; one that it left is reported again next time.
void afterRebuilt(const std::string& path)
{
    if (access(path.c_str(), F_OK) == 0)
        return;
    (void)unlink((path + JOURNAL_SUFFIX).c_str());
}

// Answers whether the leftover was reported.
bool rescue(const std::string& path, const Report& report)
{
    const FileDescriptor journal(openLocked(path + JOURNAL_SUFFIX));
    if (!journal)
        return false; // another process is at it
    const FileDescriptor file(open(path.c_str(), O_RDWR | O_CLOEXEC | O_NOFOLLOW));
    if (!file) {
        if (errno == ENOENT)
            removeGroup(path);
        return false;
    }
    const RebuildResult result = rebuildRecording(file.get(), journal.get());
    switch (result.outcome) {
    case Rebuild::COMPLETE:
        report(RECORDER_LEFTOVER_REBUILT, path, result.format);
        afterRebuilt(path);
        return true;
    case Rebuild::EMPTY:
        report(RECORDER_LEFTOVER_EMPTY, path, result.format);
        removeGroup(path);
        return true;
    case Rebuild::BEYOND_RESCUE:
        setDamagedAside(path, result.format, report);
        return true;
    case Rebuild::FAILED:
        break;
    }
    return false;
}

}

int recorder_rescue_leftovers(const char* temporary_path, recorder_leftover_cb callback, void* user_data)
{
    if (temporary_path == nullptr || *temporary_path == '\0')
        return RECORDER_ERROR_INVALID_PARAMETER;
    const std::string path = temporary_path;
    if (!isClaimedHere(path))
        moveTemporaryAside(path);
    int count = 0;
    for (const auto& group : rescueGroups(directoryOf(path)))
        count += !isBeingMoved(path, group) && rescue(group, Report{callback, user_data}) ? 1 : 0;
    return count;
}

int recorder_check_temporary(const char* temporary_path)
{
    if (temporary_path == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    return isComplete(temporary_path) ? RECORDER_ERROR_NONE : RECORDER_ERROR_INVALID_OPERATION;
}

int recorder_release_temporary(const char* temporary_path)
{
    if (temporary_path == nullptr)
        return RECORDER_ERROR_INVALID_PARAMETER;
    if (isBeingWritten(temporary_path))
        return RECORDER_ERROR_INVALID_STATE;
    return releaseTemporary(temporary_path) ? RECORDER_ERROR_NONE : RECORDER_ERROR_INVALID_STATE;
}
