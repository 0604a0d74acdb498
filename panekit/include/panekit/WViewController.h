#pragma once

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {

// Owns nothing but itself: builds one view below a parent and deletes itself when the view is deleted or destroy() is
// called. Create with new. Main loop only.
class WViewController {
public:
    WViewController() = default;
    WViewController(const WViewController&) = delete;
    WViewController& operator=(const WViewController&) = delete;

    virtual const char* getClassName() const;
    // Builds the view (onCreateView, then onCreated). False when there is no view.
    virtual bool create(Evas_Object* parent, void* viewParam = nullptr);
    // Calls onDestroy, deletes the view, then this object. Allowed inside its own callbacks.
    virtual void destroy();

    // The view; null before create. Borrowed.
    [[nodiscard]] Evas_Object* getEvasObject() const;

protected:
    virtual ~WViewController();
    virtual Evas_Object* onCreateView(Evas_Object* parent, void* viewParam) = 0;
    virtual void onCreated();
    virtual void onDestroy();
    // Deletes the view; called by destroy() only.
    virtual void onDeleteView(Evas_Object* view);

private:
    static void _viewDeletedCb(void* data, Eo* canvas, Evas_Object* object, void* info);
    void _end();
    Evas_Object* _view = nullptr;
    bool _destroying = false;
};

}
