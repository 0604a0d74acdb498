#include <uxt_theme.h>

#include <algorithm>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <Elementary.h>

#include <vconf.h>

#include "look/ColorTable.h"
#include "look/FocusMark.h"
#include "look/Theme.h"

struct uxt_color_table_s {
    look::Colors colors;
};

struct uxt_font_table_s {
    look::Fonts fonts;
};

namespace {

constexpr auto DARK = "dark";

struct TintedObject {
    Evas_Object* object; // borrowed; its deletion removes the record
    std::string code;
};

struct Listener {
    uxt_theme_changed_cb callback;
    void* userData;
    bool operator==(const Listener&) const = default;
};

struct Theme {
    std::vector<std::unique_ptr<uxt_color_table_s>> colorTables;
    std::vector<std::unique_ptr<uxt_font_table_s>> fontTables;
    uxt_color_table_h colors = nullptr;
    uxt_font_table_h fonts = nullptr;
    std::vector<TintedObject> tinted;
    std::vector<Listener> listeners;
    bool watching = false;
    bool dark = false;
};

Theme& theme()
{
    static Theme instance;
    return instance;
}

bool readIsDark()
{
    const std::unique_ptr<char, decltype(&std::free)> value(vconf_get_str(platform::KEY_THEME), &std::free);
    return value && std::string(value.get()) == DARK;
}

const look::ThemeColor* findColor(const std::string& code)
{
    if (!theme().colors)
        return nullptr;
    const auto& colors = theme().colors->colors;
    const auto found = colors.find(code);
    return found == colors.end() ? nullptr : &found->second;
}

void tint(const TintedObject& tinted)
{
    const look::ThemeColor* known = findColor(tinted.code);
    if (!known)
        return;
    auto [red, green, blue, alpha] = known->of(theme().dark);
    evas_color_argb_premul(alpha, &red, &green, &blue);
    evas_object_color_set(tinted.object, red, green, blue, alpha);
}

void setColorClass(const std::string& code, const look::Color& color)
{
    const int alpha = code == look::FOCUS_COLOR && !look::isFocusMarkShown() ? 0 : color.alpha;
    edje_color_class_set(code.c_str(), color.red, color.green, color.blue, alpha, 0, 0, 0, 0, 0, 0, 0, 0);
}

// Every code is a colour class of the layouts too, so that layouts and toolkit widgets follow the theme by themselves.
void applyColorClasses()
{
    if (!theme().colors)
        return;
    for (const auto& [code, color] : theme().colors->colors)
        setColorClass(code, color.of(theme().dark));
}

void apply()
{
    applyColorClasses();
    for (const TintedObject& tinted : theme().tinted)
        tint(tinted);
}

void themeKeyCb(keynode_t*, void*)
{
    const bool dark = readIsDark();
    if (dark == std::exchange(theme().dark, dark))
        return;
    apply();
    // A listener may remove itself or others.
    for (const Listener& listener : std::vector(theme().listeners)) {
        if (std::ranges::find(theme().listeners, listener) != theme().listeners.end())
            listener.callback(listener.userData);
    }
}

void watch()
{
    if (theme().watching)
        return;
    theme().watching = vconf_notify_key_changed(platform::KEY_THEME, themeKeyCb, nullptr) == 0;
    theme().dark = readIsDark();
}

void tintedDeletedCb(void*, Evas*, Evas_Object* object, void*)
{
    std::erase_if(theme().tinted, [object](const TintedObject& each) { return each.object == object; });
}

template <typename Table>
int deleteTable(std::vector<std::unique_ptr<Table>>& tables, Table*& current, Table* table)
{
    if (!table)
        return -1;
    if (current == table)
        current = nullptr;
    return std::erase_if(tables, [table](const auto& each) { return each.get() == table; }) > 0 ? 0 : -1;
}

}

namespace look {

void applyColorClass(const std::string& code)
{
    if (const ThemeColor* known = findColor(code); known)
        setColorClass(code, known->of(theme().dark));
}

}

uxt_color_table_h uxt_theme_add_color_table(const char* path)
{
    auto colors = look::readColorTable(path ? path : "");
    if (!colors)
        return nullptr;
    theme().colorTables.push_back(std::make_unique<uxt_color_table_s>(uxt_color_table_s{std::move(*colors)}));
    return theme().colorTables.back().get();
}

int uxt_theme_set_color_table(uxt_color_table_h table)
{
    if (!table)
        return -1;
    watch();
    theme().colors = table;
    apply();
    return 0;
}

int uxt_theme_delete_color_table(uxt_color_table_h table)
{
    if (table && theme().colors == table) {
        for (const auto& [code, color] : table->colors)
            edje_color_class_del(code.c_str());
    }
    return deleteTable(theme().colorTables, theme().colors, table);
}

uxt_font_table_h uxt_theme_add_font_table(const char* path)
{
    auto fonts = look::readFontTable(path ? path : "");
    if (!fonts)
        return nullptr;
    theme().fontTables.push_back(std::make_unique<uxt_font_table_s>(uxt_font_table_s{std::move(*fonts)}));
    return theme().fontTables.back().get();
}

int uxt_theme_set_font_table(uxt_font_table_h table)
{
    if (!table)
        return -1;
    theme().fonts = table;
    for (const auto& [name, font] : table->fonts)
        edje_text_class_set(name.c_str(), font.family.c_str(), font.size);
    return 0;
}

int uxt_theme_delete_font_table(uxt_font_table_h table)
{
    if (table && theme().fonts == table) {
        for (const auto& [name, font] : table->fonts)
            edje_text_class_del(name.c_str());
    }
    return deleteTable(theme().fontTables, theme().fonts, table);
}

bool uxt_theme_get_color(const char* code, int* red, int* green, int* blue, int* alpha)
{
    const look::ThemeColor* known = findColor(code ? code : "");
    const look::Color color = known ? known->of(theme().dark) : look::Color();
    for (const auto& [target, value] : {std::pair(red, color.red), std::pair(green, color.green),
             std::pair(blue, color.blue), std::pair(alpha, color.alpha)}) {
        if (target)
            *target = value;
    }
    return known != nullptr;
}

int uxt_theme_object_set_color(Evas_Object* object, const char* code)
{
    if (!object || !code)
        return -1;
    tintedDeletedCb(nullptr, nullptr, object, nullptr);
    evas_object_event_callback_del(object, EVAS_CALLBACK_DEL, tintedDeletedCb);
    evas_object_event_callback_add(object, EVAS_CALLBACK_DEL, tintedDeletedCb, nullptr);
    theme().tinted.push_back({object, code});
    tint(theme().tinted.back());
    return findColor(code) ? 0 : -1;
}

bool uxt_theme_is_dark(void)
{
    watch();
    return theme().dark;
}

int uxt_theme_add_changed_callback(uxt_theme_changed_cb callback, void* userData)
{
    if (!callback)
        return -1;
    watch();
    theme().listeners.push_back({callback, userData});
    return 0;
}

int uxt_theme_remove_changed_callback(uxt_theme_changed_cb callback, void* userData)
{
    return std::erase(theme().listeners, Listener{callback, userData}) > 0 ? 0 : -1;
}
