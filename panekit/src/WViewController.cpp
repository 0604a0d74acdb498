#include <panekit/WViewController.h>

#include <utility>

#include <Evas.h>

namespace panekit {

WViewController::~WViewController() = default;

const char* WViewController::getClassName() const { return "WViewController"; }

Evas_Object* WViewController::getEvasObject() const { return _view; }

void WViewController::onCreated() { }

void WViewController::onDestroy() { }

void WViewController::onDeleteView(Evas_Object* view) { evas_object_del(view); }

bool WViewController::create(Evas_Object* parent, void* viewParam)
{
    if (_view)
        return false;
    _view = onCreateView(parent, viewParam);
    if (!_view)
        return false;
    evas_object_event_callback_add(_view, EVAS_CALLBACK_DEL, _viewDeletedCb, this);
    onCreated();
    return true;
}

void WViewController::destroy()
{
    if (std::exchange(_destroying, true))
        return;
    onDestroy();
    if (Evas_Object* view = std::exchange(_view, nullptr); view) {
        evas_object_event_callback_del_full(view, EVAS_CALLBACK_DEL, _viewDeletedCb, this);
        onDeleteView(view);
    }
    delete this;
}

// The view went first, with its parent or its window: the object follows.
void WViewController::_end()
{
    if (std::exchange(_destroying, true)) {
        // onDestroy of a view inside another one's part may delete it itself.
        _view = nullptr;
        return;
    }
    onDestroy();
    _view = nullptr;
    delete this;
}

void WViewController::_viewDeletedCb(void* data, Eo*, Evas_Object*, void*)
{
    static_cast<WViewController*>(data)->_end();
}

}
