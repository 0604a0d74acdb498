#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;

namespace panekit {
class WPopupController;
}

// Opens the storage chooser over a window: it shows the model's storage, stores the one that is tapped and closes. The
// model is borrowed; the popup deletes itself, and whoever keeps it sets its destroyed handler. Main loop only.
panekit::WPopupController* mwCreateSaveToPopup(Evas_Object* window, MwModel* model);
