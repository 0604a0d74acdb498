// The process as an application: identity, resource paths, lifecycle and application events. Main loop only.
#pragma once

#include <app_control.h>

enum app_error_e {
    APP_ERROR_NONE = 0,
    APP_ERROR_INVALID_PARAMETER = -22,
    APP_ERROR_NOT_FOUND = -2,
    APP_ERROR_FAILED = -1
};

enum app_event_type_e { APP_EVENT_LOW_BATTERY, APP_EVENT_LANGUAGE_CHANGED, APP_EVENT_REGION_FORMAT_CHANGED };
typedef struct app_event_info_s* app_event_info_h;
typedef struct app_event_handler_s* app_event_handler_h;
typedef void (*app_event_cb)(app_event_info_h info, void* user_data);

// What the framework (panekit::WApp) wants to hear. create answers false to abort the start.
struct ui_app_lifecycle_s {
    bool (*create)(void* user_data);
    void (*control)(app_control_h request, bool first_launch, void* user_data);
    void (*pause)(void* user_data);
    void (*resume)(void* user_data);
    void (*terminate)(void* user_data);
};

typedef struct app_context_s* app_context_h;

extern "C" {
// Initialises the toolkit and the services, runs the main loop until ui_app_exit, a signal or the closed window,
// and answers the process's exit status. An ordinary second start hands its request to the running instance and
// answers 0 at once.
int ui_app_main(int argc, char** argv, const ui_app_lifecycle_s* lifecycle, void* user_data);
// Ends the main loop; terminate runs, pause does not. May be called more than once.
void ui_app_exit(void);
// The main window was closed by the user or the session ends: pause (when resumed), then terminate.
void ui_app_close(void);
// The framework tells whether the main window can be seen at all (neither minimised nor withdrawn). Together with
// the lock state this decides between pause and resume.
void ui_app_set_window_visible(bool visible);
// The main window, for toasts and key grabs: an Evas_Object*, borrowed, null to forget it.
void ui_app_set_window(void* window);

// The same without the toolkit and without a window: for companions. They resume at once and never pause.
int service_app_main(int argc, char** argv, const ui_app_lifecycle_s* lifecycle, void* user_data);

// For companions, before anything else: the id of this program, com.tovanic.mewlo-lite when not set.
int app_set_id(const char* id);
// Strings are newly allocated (free). Paths end in a slash; null when there is none.
int app_get_id(char** id);
char* app_get_resource_path(void);
char* app_get_shared_resource_path(void);

int app_add_event_handler(app_event_handler_h* handler, app_event_type_e type, app_event_cb callback, void* user_data);
int app_remove_event_handler(app_event_handler_h handler);
// The language of a language-changed event, such as "de_DE"; newly allocated.
int app_event_get_language(app_event_info_h info, char** language);

// A running application by its id, and its return to the foreground.
int app_manager_get_app_context(const char* app_id, app_context_h* context);
int app_manager_resume_app(app_context_h context);
int app_manager_context_destroy(app_context_h context);

// Resources by type and name; the path is newly allocated. Type 0 is images and layouts.
enum app_resource_e { APP_RESOURCE_TYPE_IMAGE = 0 };
int app_resource_manager_init(void);
int app_resource_manager_get(app_resource_e type, const char* name, char** path);
int app_resource_manager_release(void);
}
