#pragma once

#include <Mutex.h>
#include <app_control.h>
#include <media_content.h>
#include <recorder.h>

#include <atomic>
#include <ctime>
#include <optional>
#include <string>
#include <vector>

#include "MwHandle.h"
#include "MwPlayerState.h"
#include "MwRecorderState.h"

enum MwStorageType : int { MW_STORAGE_DEVICE = 0, MW_STORAGE_CARD = 1 };

// One listed recording.
struct MwFileInfo {
    std::string path;
    std::string displayName; // with extension
    std::string mediaId;
    time_t modifiedTime = 0;
    int duration = 0; // milliseconds
    bool operator==(const MwFileInfo&) const = default;
};

struct MwBookmark {
    int index = 0;
    unsigned int markedTime = 0; // seconds
    std::string name;
};

// The state that every component shares: settings of the next recording, mirrors of the engines' states, the catalogue,
// names and bookmarks. Created by MwApp before anything else. Single values, names and bookmarks may be used from the
// main loop and the command worker; the catalogue (recorded file list) belongs to the main loop.
class MwModel {
public:
    static constexpr int APP_STATE_CREATED = 0, APP_STATE_RESUMED = 1, APP_STATE_PAUSED = 2, APP_STATE_TERMINATED = 3;
    static constexpr int FORMAT_MP4 = 1, FORMAT_AMR = 2;
    static constexpr int CODEC_AMR = 0, CODEC_AAC = 1;
    static constexpr int NO_SIZE_LIMIT = 4194304; // kilobytes
    static constexpr double SILENCE = -300.0; // decibels
    static constexpr size_t MAX_BOOKMARKS = 50;

    using RecordedFileCallback = bool (*)(media_info_h media, void* userData);

    MwModel() = default;
    MwModel(const MwModel&) = delete;
    MwModel& operator=(const MwModel&) = delete;

    // Catalogue and play order
    // Without those of the private storage while it is closed.
    bool createRecordedFileList();
    // The two halves of it: the first one is for any thread.
    static std::vector<MwFileInfo> readRecordedFiles();
    void setRecordedFiles(std::vector<MwFileInfo> files);
    // Whether the list leaves any out.
    [[nodiscard]] bool hasHiddenRecordings() const { return _hasHidden; }
    [[nodiscard]] static bool isHiddenRecording(const std::string& path);
    void destroyRecordedFileList();
    static bool foreachRecordedFiles(RecordedFileCallback callback, void* userData);
    [[nodiscard]] const std::vector<MwFileInfo>& getRecordedFileList() const { return _recordedFiles; }
    // Another number after every change of the list, never 0.
    [[nodiscard]] unsigned int getCatalogueRevision() const { return _catalogueRevision; }
    // Borrowed until the list changes; null when it is not listed.
    [[nodiscard]] const MwFileInfo* getRecordedFileInfoByPath(const std::string& path) const;
    // Keep the list in step with files that were deleted or renamed. Answers how many were listed.
    size_t removeRecordedFiles(const std::vector<std::string>& paths);
    bool renameRecordedFile(const std::string& path, const std::string& newPath, const std::string& newDisplayName);
    [[nodiscard]] std::optional<std::string> getPreviousPlayPath() const;
    [[nodiscard]] std::optional<std::string> getNextPlayPath() const;
    // Milliseconds, 0 when unknown.
    [[nodiscard]] unsigned int getCurrentPlayDuration() const;
    [[nodiscard]] static std::string getDurationText(unsigned int milliseconds, bool withHours);
    // How long a recording is, at least one second; dashes when nobody knows.
    [[nodiscard]] static std::string getLengthText(int milliseconds);

    // Storage. From hold to release, for one recording, type, root and all paths stay what they are, whatever happens
    // to the card and the choice.
    void holdStorage();
    void releaseStorage();
    // Whether a recording is under way: from before its start until its save has ended.
    [[nodiscard]] bool isStorageHeld() const { return _heldStorage().has_value(); }
    [[nodiscard]] MwStorageType getStorageType() const;
    // The stored choice, whether or not a card is mounted.
    [[nodiscard]] MwStorageType getStorageChoice() const;
    void setStorageType(MwStorageType type);
    [[nodiscard]] std::string getStorageRoot() const;
    // The recorder's temporary file and the final path of a name in the current storage and format.
    [[nodiscard]] std::string getTemporaryFilePath() const;
    [[nodiscard]] std::string getRecordingsDirectory() const;
    [[nodiscard]] std::string getRecordingPath(const std::string& name) const;
    [[nodiscard]] const char* getFileExtension() const;

    // Names and numbering
    bool updateLastRecordedFileNumber();
    bool updateNextRecordingFileName();
    [[nodiscard]] std::string getDefaultRecordingFileName() const;
    [[nodiscard]] bool checkRecordFileNameExist(const std::string& name) const;
    // Releases the number of a recording that was discarded or refused.
    void windBackRecordingFileName();

    // Bookmarks of the running recording
    bool addBookMark(unsigned int& markedTime);
    void clearBookMark();
    // All of them or none.
    bool saveBookMark(const char* mediaId);
    [[nodiscard]] std::vector<MwBookmark> getBookmarkList() const;
    // Keeps name and bookmarks of the running recording beside its temporary file, for a rescue after a crash.
    bool saveRecordingNotes() const;

    // The request to reply to: a clone owned by the model, null to forget it.
    // Another request has no answer yet.
    void setRequestHandle(app_control_h request);
    [[nodiscard]] app_control_h getRequestHandle() const { return _request.get(); }
    // The recording that was saved for the request; empty when there is none.
    void setAnswerPath(const std::string& path) { _setText(&Texts::answerPath, path); }
    [[nodiscard]] std::string getAnswerPath() const { return _text(&Texts::answerPath); }

    // Whether a file is there, of the type that was asked for, and no larger.
    [[nodiscard]] bool fitsRequest(const std::string& path) const;
    // Whether several recordings of the catalogue, read anew, fit.
    [[nodiscard]] bool hasRequestChoice();
    void setTypeRequested(bool requested) { _typeRequested = requested; }

    int getAppState() const { return _appState; }
    void setAppState(int state) { _appState = state; }
    MwRecorderState getRecorderState() const { return _recorderState; }
    // Also publishes the state to other instances, unless this one serves a request.
    void setRecorderState(MwRecorderState state);
    // What an instance published that still runs: whether it records or holds a recording.
    [[nodiscard]] static bool isMainInstanceRecording();
    int getAudioCodec() const { return _audioCodec; }
    void setAudioCodec(int codec) { _audioCodec = codec; }
    int getFileFormat() const { return _fileFormat; }
    void setFileFormat(int format) { _fileFormat = format; }
    int getSizeLimit() const { return _sizeLimit; } // kilobytes
    void setSizeLimit(int kilobytes) { _sizeLimit = kilobytes; }
    int getSampleRate() const { return _sampleRate; } // hertz
    void setSampleRate(int hertz) { _sampleRate = hertz; }
    int getBitRate() const { return _bitRate; } // bits per second
    void setBitRate(int bitsPerSecond) { _bitRate = bitsPerSecond; }
    int getEstimatedRecordingMaxTime() const { return _maxTime; } // seconds, 0 for no limit
    void setEstimatedRecordingMaxTime(int seconds) { _maxTime = seconds; }
    [[nodiscard]] std::string getCurrentRecordingFileName() const { return _text(&Texts::currentName); }
    void setCurrentRecordingFileName(const std::string& name) { _setText(&Texts::currentName, name); }
    // A name of the user's, which stays with the recording until it ends.
    void chooseCurrentRecordingFileName(const std::string& name);
    // The user's name for the next recording, empty for the default one.
    [[nodiscard]] std::string getRenameString() const { return _text(&Texts::renameString); }
    void setRenameString(const std::string& name) { _setText(&Texts::renameString, name); }
    unsigned long long getElapsedTime() const { return _elapsedTime; } // milliseconds recorded
    void setElapsedTime(unsigned long long milliseconds) { _elapsedTime = milliseconds; }
    // What was recorded is not worth keeping: a stop throws it away.
    [[nodiscard]] bool isTooShort() const { return _elapsedTime < SHORTEST_RECORDING; }
    double getLevel() const { return _level; } // decibels
    void setLevel(double decibels) { _level = decibels; }
    MwPlayerState getPlayerState() const { return _playerState; }
    void setPlayerState(MwPlayerState state) { _playerState = state; }
    [[nodiscard]] std::string getCurrentPlayPath() const { return _text(&Texts::playPath); }
    void setCurrentPlayPath(const std::string& path) { _setText(&Texts::playPath, path); }
    unsigned int getCurrentPlayPosition() const { return _playPosition; } // milliseconds
    void setCurrentPlayPosition(unsigned int milliseconds) { _playPosition = milliseconds; }
    bool isRequestMode() const { return _requestMode; }
    void setRequestMode(bool on) { _requestMode = on; }
    bool isTrimMode() const { return _trimMode; }
    void setTrimMode(bool on) { _trimMode = on; }
    bool isPlayViewShown() const { return _playView; }
    void setPlayViewShown(bool shown) { _playView = shown; }

private:
    static constexpr unsigned long long SHORTEST_RECORDING = 1000; // milliseconds

    struct FileNumbers {
        unsigned long long last = 0;
        unsigned long long prefix = 0;
        unsigned long long postfix = 0;
    };

    static void _getFileNumberFromFileName(
        const char* fileName, unsigned long long& last, unsigned long long& prefix, unsigned long long& postfix);
    static bool _collectNumbersCb(media_info_h media, void* userData);
    static bool _collectFileCb(media_info_h media, void* userData);
    std::string _advanceToFreeName(FileNumbers& numbers) const;
    [[nodiscard]] std::optional<size_t> _currentPlayIndex() const;

    struct Texts {
        std::string currentName;
        std::string renameString;
        std::string playPath;
        std::string answerPath;
    };
    std::string _text(std::string Texts::*field) const
    {
        const platform::Lock lock(_mutex);
        return _texts.*field;
    }
    void _setText(std::string Texts::*field, const std::string& value)
    {
        const platform::Lock lock(_mutex);
        _texts.*field = value;
    }

    using RequestHandle = MwHandle<app_control_h, app_control_destroy>;

    struct Storage {
        MwStorageType type;
        std::string root;
    };
    [[nodiscard]] std::optional<Storage> _heldStorage() const
    {
        const platform::Lock lock(_storageMutex);
        return _storage;
    }

    mutable platform::Mutex _storageMutex; // nothing else is locked under it
    std::optional<Storage> _storage GUARDED_BY(_storageMutex); // of the running recording
    mutable platform::Mutex _mutex;
    Texts _texts GUARDED_BY(_mutex);
    std::atomic<int> _appState = APP_STATE_CREATED;
    std::atomic<MwRecorderState> _recorderState = REC_STATE_NONE;
    std::atomic<int> _audioCodec = CODEC_AAC;
    std::atomic<int> _fileFormat = FORMAT_MP4;
    std::atomic<int> _sizeLimit = NO_SIZE_LIMIT;
    std::atomic<int> _sampleRate = RECORDER_AAC_SAMPLE_RATE;
    std::atomic<int> _bitRate = RECORDER_AAC_BIT_RATE;
    std::atomic<int> _maxTime = 0;
    bool _nameIsChosen GUARDED_BY(_mutex) = false;
    FileNumbers _numbers GUARDED_BY(_mutex);
    std::atomic<unsigned long long> _elapsedTime = 0;
    std::atomic<double> _level = SILENCE;
    std::atomic<MwPlayerState> _playerState = PLAY_STATE_NONE;
    std::atomic<unsigned int> _playPosition = 0;
    std::atomic<bool> _requestMode = false;
    std::atomic<bool> _typeRequested = false;
    std::atomic<bool> _trimMode = false;
    std::atomic<bool> _playView = false;
    RequestHandle _request;
    std::vector<MwFileInfo> _recordedFiles;
    unsigned int _catalogueRevision = 1;
    bool _hasHidden = false;
    std::vector<MwBookmark> _bookmarks GUARDED_BY(_mutex);
};
