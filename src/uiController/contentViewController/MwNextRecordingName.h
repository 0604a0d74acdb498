#pragma once

#include <functional>
#include <memory>
#include <string>

#include <panekit/WTimer.h>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;
class MwRenamePopupController;

// The name that the next recording gets: edited by the user in a popup, and counted on when the catalogue has changed.
// What has become of it is told to the screen, which shows it. The model is borrowed. Main loop only.
class MwNextRecordingName {
public:
    using Changed = std::function<void(const std::string& name)>;

    MwNextRecordingName(MwModel* model, Changed changed);
    ~MwNextRecordingName();
    MwNextRecordingName(const MwNextRecordingName&) = delete;
    MwNextRecordingName& operator=(const MwNextRecordingName&) = delete;

    [[nodiscard]] bool isEdited() const { return _renamePopup != nullptr; }
    void _renameRecordingFileName(Evas_Object* window);
    void _createUpdateNextRecordingFileNameTimer();
    void cancelUpdate();

private:
    void _renameResponseCb(const char* text, int response);
    void _destroyRenamePopup();
    void _updateNextRecordingFileName();

    MwModel* _model;
    Changed _changed;
    std::unique_ptr<MwRenamePopupController> _renamePopup;
    panekit::WTimer::Weak _nextNameIdler;
};
