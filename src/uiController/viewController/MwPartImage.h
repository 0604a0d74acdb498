#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// Puts one of the application's pictures, tinted with a theme colour code, into a part of a button. False without the
// file of the pictures (logged). Main loop only.
bool mwSetPartImage(Evas_Object* button, const char* part, const char* image, const char* color);
