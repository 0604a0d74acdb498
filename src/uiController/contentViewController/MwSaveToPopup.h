#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
class MwModel;

namespace panekit {
class WPopupController;
}

// The storage chooser: it shows the model's storage, stores the one that is tapped and closes. The model is borrowed;
// the popup closes with this object at the latest. Main loop only.
class MwSaveToPopup {
public:
    explicit MwSaveToPopup(MwModel* model);
    ~MwSaveToPopup();
    MwSaveToPopup(const MwSaveToPopup&) = delete;
    MwSaveToPopup& operator=(const MwSaveToPopup&) = delete;

    // Over a window; without effect while it is open.
    void open(Evas_Object* window);
    void close();
    [[nodiscard]] bool isOpen() const { return _popup != nullptr; }

private:
    MwModel* _model;
    panekit::WPopupController* _popup = nullptr; // deletes itself
};
