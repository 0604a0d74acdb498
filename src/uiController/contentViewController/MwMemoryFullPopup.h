#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {
class WPopupController;
}

// Tells over a window that a storage (an MwStorageType) has too little room, and offers the settings. The popup deletes
// itself. Main loop only.
panekit::WPopupController* mwCreateMemoryFullPopup(Evas_Object* window, int storage);
