#pragma once

#include <functional>
#include <memory>
#include <string>

#include "MwRecordingsFileJob.h"

class MwRenamePopupController;

// Gives a recording another name: the window that asks for it, and the job that does it. Model and job are borrowed.
// Main loop only.
class MwRecordingsRenaming {
public:
    MwRecordingsRenaming(MwModel* model, MwRecordingsFileJob* job, std::function<void()> renamed);
    ~MwRecordingsRenaming();
    MwRecordingsRenaming(const MwRecordingsRenaming&) = delete;
    MwRecordingsRenaming& operator=(const MwRecordingsRenaming&) = delete;

    void _openRenamePopup(Evas_Object* window, const std::string& path);
    void _closeRenamePopup();
    [[nodiscard]] bool isOpen() const { return _renamePopup != nullptr; }
    // Of the recording that is being renamed.
    [[nodiscard]] const std::string& path() const { return _renameTarget; }

private:
    void _renameResponseCb(const char* text, int response);
    bool _renameRecording(const std::string& name);
    void _onRenamed(MwRecordingsFileJob::Outcome outcome, const std::string& path, const std::string& newPath);

    MwModel* _model;
    MwRecordingsFileJob* _job;
    std::function<void()> _renamed;
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    std::string _renameTarget; // path
};
