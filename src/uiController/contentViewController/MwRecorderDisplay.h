#pragma once

#include <string>

#include <panekit/WTimer.h>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;

// What a recorder screen shows beside its buttons: time, name, hint, level ring, the flash of a bookmark. It draws from
// the model into the layout, both borrowed. Main loop only.
class MwRecorderDisplay {
public:
    MwRecorderDisplay(Evas_Object* layout, MwModel* model);
    ~MwRecorderDisplay();
    MwRecorderDisplay(const MwRecorderDisplay&) = delete;
    MwRecorderDisplay& operator=(const MwRecorderDisplay&) = delete;

    // Plain text; empty clears it.
    void _updateFileName(const std::string& name);
    void _updateSubtitle();
    // Forgets what it showed last.
    void resetRecordingTime();
    void _updateRecordingTime();
    void _updateRecordingEffect(bool show);
    void _updateBlinking(bool blink);
    void _updateBookMarkEffect(unsigned int seconds);
    // While it records: the time follows.
    void _createRecordingStatusUpdateTimer();
    void _destroyRecordingStatusUpdateTimer();

private:
    bool _blink();

    Evas_Object* _layout;
    MwModel* _model;
    unsigned int _lastShownSeconds = 0;
    panekit::WTimer::Weak _blinkTimer;
    panekit::WTimer::Weak _statusUpdateTimer;
};
