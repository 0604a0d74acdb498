#include "minicontrol.h"

#include "desktop/ControlWindow.h"
#include "launch/Toolkit.h"

#include <Ecore_Evas.h>
#include <Elementary.h>

#include <cstdlib>
#include <string_view>

namespace {

// Such as "software_x11". Asked of the program's own window; without one, what the toolkit would take.
std::string_view engine()
{
    auto* window = static_cast<Evas_Object*>(platform::mainWindow());
    if (window != nullptr)
        return ecore_evas_engine_name_get(ecore_evas_ecore_evas_get(evas_object_evas_get(window)));
    if (ecore_x_display_get() != nullptr)
        return "software_x11";
    const char* chosen = std::getenv("ELM_ENGINE");
    return chosen != nullptr ? chosen : "";
}

}

bool minicontrol_is_supported(minicontrol_viewer_e viewer)
{
    const bool known = viewer == MINICONTROL_VIEWER_PANEL || viewer == MINICONTROL_VIEWER_LOCKSCREEN;
    return known && (engine().ends_with("x11") || engine() == "buffer");
}

Evas_Object* minicontrol_create_window(
    const char* name, minicontrol_viewer_e viewer, minicontrol_provider_event_cb callback)
{
    if (name == nullptr || !minicontrol_is_supported(viewer))
        return nullptr;
    return platform::ControlWindow::create(name, viewer, callback);
}

bool minicontrol_is_seen(const Evas_Object* window)
{
    const platform::ControlWindow* control = platform::ControlWindow::of(window);
    return control != nullptr && control->isSeen();
}
