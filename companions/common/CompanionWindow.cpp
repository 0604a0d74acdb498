#include "CompanionWindow.h"

#include <Elementary.h>

#include <app.h>
#include <panekit/WLanguage.h>
#include <panekit/WWindowController.h>
#include <uxt_theme.h>

#include <cstdlib>
#include <libintl.h>
#include <memory>

namespace {

constexpr auto TEXT_DOMAIN = "mewlo-lite";
constexpr auto TABLES = "tables/com.tovanic.mewlo-lite_Changeable";
constexpr double BASE_SCALE = 2.6;

std::string adopt(char* text)
{
    const std::unique_ptr<char, decltype(&std::free)> owner(text, &std::free);
    return text != nullptr ? text : "";
}

}

CompanionWindow::CompanionWindow(const char* id, const char* titleId, int width, int height)
    : _id(id)
    , _titleId(titleId)
    , _width(width)
    , _height(height)
{
    app_set_id(id);
}

bool CompanionWindow::onCreate()
{
    elm_app_base_scale_set(BASE_SCALE);
    _resources = adopt(app_get_resource_path());
    bindtextdomain(TEXT_DOMAIN, (_resources + "locale").c_str());
    bind_textdomain_codeset(TEXT_DOMAIN, "UTF-8");
    textdomain(TEXT_DOMAIN);
    auto window = std::make_unique<panekit::WWindowController>(_id, ELM_WIN_DIALOG_BASIC);
    window->setTitle(panekit::WLanguage::text(_titleId));
    if (!attachWindow(std::move(window)))
        return false;
    elm_theme_extension_add(nullptr, (_resources + "edje/MwButton.edj").c_str());
    const std::string tables = adopt(app_get_shared_resource_path()) + TABLES;
    uxt_theme_set_color_table(uxt_theme_add_color_table((tables + "ColorInfo.xml").c_str()));
    uxt_theme_set_font_table(uxt_theme_add_font_table((tables + "FontInfo.xml").c_str()));
    evas_object_resize(getWindow()->getEvasObject(), ELM_SCALE_SIZE(_width), ELM_SCALE_SIZE(_height));
    return true;
}
