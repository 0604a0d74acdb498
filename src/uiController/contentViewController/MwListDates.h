#pragma once

#include <ctime>
#include <string>

#include "MwICU.h"

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// The date formatter of a list, kept by its genlist under "icu" and freed with it. Main loop only.

// Makes the formatter, or replaces it: one keeps the settings it was made with.
void mwRenewDates(Evas_Object* genlist);
// Empty when there is no formatter or it fails (logged).
std::string mwDateText(Evas_Object* genlist, time_t time, MwICU::Kind kind);
