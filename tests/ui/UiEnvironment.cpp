#include "UiEnvironment.h"

#include <Efreet.h>
#include <Elementary.h>

#include <cstdlib>
#include <libintl.h>

#include <panekit/WLanguage.h>
#include <uxt_theme.h>
#include <vconf.h>

#include "support/RunUntil.h"

namespace ui {

namespace {

    std::string resources()
    {
        const char* directory = std::getenv("MEWLO_RESOURCE_DIR");
        return directory != nullptr ? directory : MEWLO_TEST_RESOURCES;
    }

    void useLook()
    {
        const std::string directory = resources();
        elm_theme_overlay_add(nullptr, (directory + "edje/MwTheme.edj").c_str());
        for (const char* file : {"edje/MwGenlist.edj", "edje/MwButton.edj"})
            elm_theme_extension_add(nullptr, (directory + file).c_str());
        const std::string table = directory + "tables/com.tovanic.mewlo-lite_Changeable";
        uxt_theme_set_color_table(uxt_theme_add_color_table((table + "ColorInfo.xml").c_str()));
        uxt_theme_set_font_table(uxt_theme_add_font_table((table + "FontInfo.xml").c_str()));
        panekit::WLanguage::initialize();
        bindtextdomain("mewlo-lite", (directory + "locale").c_str());
        bind_textdomain_codeset("mewlo-lite", "UTF-8");
        textdomain("mewlo-lite");
    }

}

Environment::Environment(int argc, char** argv)
{
    support::useHome(_home);
    ::setenv("MEWLO_RESOURCE_DIR", resources().c_str(), 1);
    ::setenv("MEWLO_HOST", "none", 1);
    ::setenv("ELM_ENGINE", "buffer", 1);
    ::setenv("ELM_PROFILE", "standard", 1);
    ::unsetenv("DISPLAY");
    efreet_cache_disable();
    ecore_app_no_system_modules();
    elm_init(argc, argv);
    elm_app_base_scale_set(2.6);
    if (!std::getenv("ELM_SCALE"))
        elm_config_scale_set(1.3);
    useLook();
}

Environment::~Environment() { elm_shutdown(); }

void useTheme(bool dark)
{
    vconf_set_str("db/setting/theme", dark ? "dark" : "light");
    support::runUntil([dark] { return uxt_theme_is_dark() == dark; }, 5.0);
}

}
