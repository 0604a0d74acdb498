// Small control windows of this program outside its own window: one on the desktop's panel, one over the lock screen.
// Main loop only.
//
// The window that a create answers belongs to the caller, who fills, sizes, shows and deletes it like any other.
// "Shown" means wanted: the service puts it on the screen while that makes sense and takes it away again by itself. The
// panel's window is on the screen while the program's own window is not (minimised, on another desktop) or the screen
// is locked; the lock screen's while the screen is locked. Neither is over a full-screen window of another program.
#pragma once

#include "app_control.h"

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

enum minicontrol_viewer_e { MINICONTROL_VIEWER_PANEL = 1, MINICONTROL_VIEWER_LOCKSCREEN = 2 };
enum minicontrol_provider_event_e {
    MINICONTROL_PROVIDER_EVENT_REQUEST_HIDE = 100, // the user closed the window (it is still there)
};
typedef void (*minicontrol_provider_event_cb)(minicontrol_provider_event_e event, bundle* arguments);

// Called on the window (event information: null) after minicontrol_is_seen has changed.
#define MINICONTROL_SEEN_CHANGED "minicontrol,seen,changed"

extern "C" {
// Whether this session lets a program place such windows: X11 does, and the buffer engine for tests.
bool minicontrol_is_supported(minicontrol_viewer_e viewer);
// Null when it is not, or when no window could be made.
Evas_Object* minicontrol_create_window(
    const char* name, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback);
// Whether somebody can see it now: on the screen, not covered, display on.
bool minicontrol_is_seen(const Evas_Object* window);
}
