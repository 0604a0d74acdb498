// The back and more keys: Escape, XF86Back, Alt+Left; Menu, F10. The last registered visible object of a window wins.
// Main loop only.
#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
enum Eext_Callback_Type { EEXT_CALLBACK_BACK, EEXT_CALLBACK_MORE };
typedef void (*Eext_Event_Cb)(void* user_data, Evas_Object* object, void* event_info);

extern "C" {
void eext_object_event_callback_add(
    Evas_Object* object, Eext_Callback_Type type, Eext_Event_Cb callback, void* user_data);
// Call once for every window so that the keys work in it before anything is registered.
void eext_window_arm(Evas_Object* window);
}
