#pragma once

#include "host/X11Desktop.h"
#include "minicontrol.h"
#include "state/KeyTree.h"

#include <Ecore.h>

#include <memory>
#include <string>
#include <vector>

namespace platform {

// One control window: on the screen when its owner wants it there and the desktop has a place for it. Belongs to its
// toolkit window and goes with it.
class ControlWindow {
public:
    static Evas_Object* create(const char* name, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback);
    // Null when the window is none.
    static const ControlWindow* of(const Evas_Object* window);
    [[nodiscard]] bool isSeen() const { return _isSeen; }

    ~ControlWindow();
    ControlWindow(const ControlWindow&) = delete;
    ControlWindow& operator=(const ControlWindow&) = delete;

private:
    ControlWindow(Evas_Object* window, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback);
    void _listen();
    void _listenToX11();
    void _listenToPointer();
    static void _showCb(void* self, Evas_Object* window);
    static void _hideCb(void* self, Evas_Object* window);
    void _wish(bool wanted);
    void _later();
    void _apply();
    [[nodiscard]] bool _hasPlace() const;
    void _setOnScreen(bool on);
    void _showToScreenReaders(bool on);
    void _place();
    void _tellWhetherSeen();
    void _beginDrag(int x, int y);
    void _drag(int x, int y);
    void _endDrag(int x, int y);

    Evas_Object* _window; // it owns this object
    const minicontrol_viewer_e _viewer;
    const minicontrol_provider_event_cb _callback;
    bool _isWanted = false;
    bool _isOnScreen = false;
    bool _isCovered = false;
    bool _isSeen = false;
    bool _isOurs = false; // showing or hiding is the service's own doing
    bool _isDragged = false;
    int _gripX = 0; // of the pointer in the window
    int _gripY = 0;
    std::unique_ptr<host::X11Desktop> _desktop; // on X11
    std::vector<Ecore_Event_Handler*> _handlers;
    std::vector<KeyTree::WatchId> _watches;
    Ecore_Job* _job = nullptr;
};

}
