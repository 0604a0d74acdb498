#pragma once

#include <Efreet.h>
#include <Elementary.h>
#include <uxt_theme.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "MwResourceMgr.h"

namespace bench {

// The toolkit at a scale.
inline void initToolkit(int argc, char** argv, double scale, const char* engine = "buffer")
{
    ::setenv("ELM_ENGINE", engine, 1);
    efreet_cache_disable();
    ecore_app_no_system_modules();
    elm_init(argc, argv);
    elm_app_base_scale_set(2.6);
    elm_config_scale_set(scale);
}

inline std::string resource(const char* name)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(name, path))
        std::fprintf(stderr, "bench: there is no %s\n", name);
    return path;
}

// The application's look.
inline void loadLook()
{
    MwResourceMgr::getInstance()->initialize();
    elm_theme_extension_add(nullptr, resource("edje/MwButton.edj").c_str());
    uxt_theme_set_color_table(
        uxt_theme_add_color_table(resource("tables/com.tovanic.mewlo-lite_ChangeableColorInfo.xml").c_str()));
}

// A window with that look, and in it a layout that panels dock in.
inline Evas_Object* openWindow(int width, int height)
{
    loadLook();
    Evas_Object* window = elm_win_util_standard_add("bench", "bench");
    evas_object_resize(window, width, height);
    Evas_Object* host = elm_layout_add(window);
    elm_layout_file_set(host, resource("edje/MwBookmarksContentView.edj").c_str(), "bookmarks_content_view");
    evas_object_size_hint_weight_set(host, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_win_resize_object_add(window, host);
    evas_object_show(host);
    evas_object_show(window);
    return host;
}

}
