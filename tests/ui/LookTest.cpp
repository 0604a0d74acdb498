#include <gtest/gtest.h>

#include <Elementary.h>

#include <array>
#include <cstring>
#include <fstream>
#include <libintl.h>
#include <regex>
#include <set>

#include <panekit/WLanguage.h>
#include <uxt_theme.h>
#include <vconf.h>

#include "UiEnvironment.h"
#include "support/RunUntil.h"
#include "support/Screen.h"
#include "support/TempDir.h"

using panekit::WLanguage;

namespace {

using Rgba = std::array<int, 4>;

Rgba color(const char* code)
{
    Rgba found{};
    uxt_theme_get_color(code, &found[0], &found[1], &found[2], &found[3]);
    return found;
}

Rgba colorOf(Evas_Object* object)
{
    Rgba found{};
    evas_object_color_get(object, &found[0], &found[1], &found[2], &found[3]);
    return found;
}

// Puts a table of its own in force, and the application's table back.
class TableTest : public ::testing::Test {
protected:
    void SetUp() override { ui::useTheme(false); }
    void TearDown() override
    {
        uxt_theme_delete_color_table(_table);
        ui::useTheme(false);
    }
    uxt_color_table_h load(const std::string& content)
    {
        support::writeFile(_directory.file("table.xml"), content);
        return uxt_theme_add_color_table(_directory.file("table.xml").c_str());
    }
    support::TempDir _directory;
    uxt_color_table_h _table = nullptr;
};

TEST_F(TableTest, ColoursFollowTheThemeWithEverythingTinted)
{
    _table = load(R"(<colors><color code="T1" light="#102030" dark="#40506080"/></colors>)");
    ASSERT_NE(nullptr, _table);
    ASSERT_EQ(0, uxt_theme_set_color_table(_table));
    Evas_Object* window = elm_win_util_standard_add("test", "test");
    Evas_Object* rectangle = evas_object_rectangle_add(evas_object_evas_get(window));
    EXPECT_EQ(0, uxt_theme_object_set_color(rectangle, "T1"));
    EXPECT_EQ((Rgba{16, 32, 48, 255}), color("T1"));
    EXPECT_EQ((Rgba{16, 32, 48, 255}), colorOf(rectangle));

    ui::useTheme(true);
    EXPECT_EQ((Rgba{64, 80, 96, 128}), color("T1"));
    EXPECT_EQ((Rgba{32, 40, 48, 128}), colorOf(rectangle)); // premultiplied
    int red = 0;
    EXPECT_TRUE(edje_color_class_get(
        "T1", &red, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr));
    EXPECT_EQ(64, red);

    evas_object_del(rectangle); // and nobody tints it any more
    ui::useTheme(false);
    EXPECT_EQ((Rgba{16, 32, 48, 255}), color("T1"));
    EXPECT_FALSE(uxt_theme_get_color("unknown", nullptr, nullptr, nullptr, nullptr));
    EXPECT_EQ((Rgba{255, 255, 255, 255}), color("unknown"));
    evas_object_del(window);
}

TEST_F(TableTest, WrongTablesAreRefused)
{
    for (const char* content : {"", "no xml", "<colors><color code='A' light='#12345' dark='#000000'/></colors>",
             "<colors><color code='A' light='#12345g' dark='#000000'/></colors>",
             "<colors><color light='#123456' dark='#000000'/></colors>", "<colors><color code='A' light='#123456'/>"})
        EXPECT_EQ(nullptr, load(content)) << content;
    EXPECT_EQ(nullptr, uxt_theme_add_color_table("/no/such/file"));
    EXPECT_EQ(nullptr, uxt_theme_add_color_table(nullptr));
    EXPECT_NE(0, uxt_theme_set_color_table(nullptr));
    EXPECT_NE(0, uxt_theme_delete_color_table(nullptr));
}

TEST_F(TableTest, ListenersHearChangesOnlyAndMayRemoveThemselves)
{
    static int heard;
    heard = 0;
    const auto once = [](void* data) {
        ++heard;
        uxt_theme_remove_changed_callback(reinterpret_cast<uxt_theme_changed_cb>(data), data);
    };
    const uxt_theme_changed_cb callback = once;
    void* self = reinterpret_cast<void*>(callback);
    uxt_theme_add_changed_callback(callback, self);
    int changes = 0;
    const auto count = [](void* data) { ++*static_cast<int*>(data); };
    uxt_theme_add_changed_callback(count, &changes);
    ui::useTheme(true);
    vconf_set_str("db/setting/theme", "dark"); // the same again
    support::runFor(0.05);
    ui::useTheme(false);
    EXPECT_EQ(1, heard);
    EXPECT_EQ(2, changes);
    EXPECT_EQ(0, uxt_theme_remove_changed_callback(count, &changes));
    EXPECT_NE(0, uxt_theme_remove_changed_callback(count, &changes));
}

class LanguageTest : public ::testing::Test {
protected:
    void TearDown() override
    {
        ::setenv("LC_ALL", "C.UTF-8", 1);
        ::unsetenv("LANGUAGE");
        WLanguage::initialize();
        WLanguage::use("en");
    }
};

TEST_F(LanguageTest, EveryLocaleShowsTextsAndNeverIdentifiers)
{
    const struct {
        const char* all;
        const char* list;
        const char* text;
    } cases[] = {{"C", "", "Pause"}, {"POSIX", "", "Pause"}, {"xx_YY.UTF-8", "", "Pause"}, {"C.UTF-8", "fr", "Pause"},
        {"C.UTF-8", "de", "Lesezeichen"}, {"de_DE.UTF-8", "", "Lesezeichen"}, {"C", "fr:de", "Lesezeichen"}};
    for (const auto& each : cases) {
        SCOPED_TRACE(std::string(each.all) + " " + each.list);
        ::setenv("LC_ALL", each.all, 1);
        ::setenv("LANGUAGE", each.list, 1);
        WLanguage::initialize();
        textdomain("mewlo-lite"); // drops what gettext remembers
        const bool german = std::strcmp(each.text, "Lesezeichen") == 0;
        EXPECT_STREQ(german ? "Lesezeichen" : "Bookmark", WLanguage::text("IDS_MW_BODY_BOOKMARK"));
    }
}

TEST_F(LanguageTest, AChangeReachesTextsOnTheScreen)
{
    Evas_Object* window = elm_win_util_standard_add("test", "test");
    Evas_Object* button = elm_button_add(window);
    elm_object_domain_translatable_part_text_set(button, nullptr, "mewlo-lite", "IDS_MW_BUTTON_CANCEL");
    EXPECT_EQ("Cancel", support::text(button));
    WLanguage::use("de_DE.UTF-8");
    EXPECT_EQ("Abbrechen", support::text(button));
    WLanguage::use("ja_JP"); // no such catalogue
    EXPECT_EQ("Cancel", support::text(button));
    evas_object_del(window);
}

std::map<std::string, std::string> catalogue(const std::string& language)
{
    std::ifstream file(std::string(MEWLO_LOCALE_SOURCES) + "/" + language + ".po");
    std::map<std::string, std::string> texts;
    std::string id;
    for (std::string line; std::getline(file, line);) {
        if (line.rfind("msgid \"IDS_", 0) == 0)
            id = line.substr(7, line.size() - 8);
        else if (line.rfind("msgstr \"", 0) == 0 && !id.empty())
            texts[id] = line.substr(8, line.size() - 9);
    }
    return texts;
}

std::multiset<std::string> placeholders(const std::string& text)
{
    static const std::regex pattern("%([0-9]+\\$)?[a-z0-9]+");
    return {std::sregex_token_iterator(text.begin(), text.end(), pattern), std::sregex_token_iterator()};
}

// A placeholder that one language forgets or invents would read memory that is not there.
TEST(CatalogueTest, AllLanguagesHaveTheSameTextsWithTheSamePlaceholders)
{
    const auto english = catalogue("en");
    const auto german = catalogue("de");
    ASSERT_GT(english.size(), 90U);
    for (const auto& [id, text] : english) {
        ASSERT_TRUE(german.contains(id)) << id;
        EXPECT_EQ(placeholders(text), placeholders(german.at(id))) << id;
        EXPECT_FALSE(text.empty()) << id;
    }
    EXPECT_EQ(english.size(), german.size());
}

}
