#include "app.h"
#include "preference.h"
#include "state/Directories.h"
#include "state/Trees.h"
#include "system_settings.h"
#include "vconf.h"

#include "support/RunUntil.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <vector>

#include <sys/stat.h>

namespace {

using platform::stateTree;
using support::runFor;
using support::runUntil;

std::string taken(char* text)
{
    const std::string copy = text != nullptr ? text : "(null)";
    ::free(text);
    return copy;
}

TEST(VconfTest, FailsOnMissingAndUnparsableValues)
{
    int value = 77;
    EXPECT_NE(0, vconf_get_int("db/test/missing", &value));
    EXPECT_EQ(0, vconf_get_int(VCONFKEY_SYSMAN_BATTERY_STATUS_LOW, &value));
    EXPECT_EQ(3, value) << "full until something says otherwise";
    const struct {
        const char* text;
        bool isInt;
        bool isBool;
    } cases[] = {{"1", true, true}, {"0", true, true}, {"-12", true, false}, {"true", false, true},
        {"false", false, true}, {"", false, false}, {" 1", false, false}, {"1x", false, false}, {"0x1", false, false},
        {"99999999999", false, false}};
    for (const auto& entry : cases) {
        SCOPED_TRACE(entry.text);
        stateTree().write("db/test/value", entry.text);
        EXPECT_EQ(entry.isInt, vconf_get_int("db/test/value", &value) == 0);
        EXPECT_EQ(entry.isBool, vconf_get_bool("db/test/value", &value) == 0);
    }
    EXPECT_EQ("99999999999", taken(vconf_get_str("db/test/value")));
    for (const char* key : {"../x", "", static_cast<const char*>(nullptr)}) {
        EXPECT_EQ(-1, vconf_set_int(key, 1));
        EXPECT_EQ(-1,
            vconf_notify_key_changed(
                key, [](keynode_t*, void*) {}, nullptr));
    }
}

TEST(PreferenceTest, KeepsTypesAndReportsEveryWrite)
{
    int number = 0;
    bool truth = false;
    EXPECT_EQ(PREFERENCE_ERROR_NO_KEY, preference_get_int("MainRecordingState", &number));
    EXPECT_EQ(PREFERENCE_ERROR_INVALID_PARAMETER, preference_set_int("../escape", 1));
    EXPECT_EQ(PREFERENCE_ERROR_NONE, preference_set_int("preference/com.tovanic.mewlo-lite/storage", 1));
    EXPECT_EQ(PREFERENCE_ERROR_NONE, preference_get_int("preference/com.tovanic.mewlo-lite/storage", &number));
    EXPECT_EQ(1, number);

    int calls = 0;
    const preference_changed_cb callback = [](const char*, void* data) { ++*static_cast<int*>(data); };
    ASSERT_EQ(0, preference_set_changed_cb("MainRecordingStopRequest", callback, &calls));
    for (int request = 1; request <= 2; ++request) { // true over true is a second request
        preference_set_boolean("MainRecordingStopRequest", true);
        ASSERT_TRUE(runUntil([&] { return calls == request; }));
    }
    EXPECT_EQ(0, preference_get_boolean("MainRecordingStopRequest", &truth));
    EXPECT_TRUE(truth);
    EXPECT_EQ(0, preference_unset_changed_cb("MainRecordingStopRequest", callback));
    EXPECT_NE(0, preference_unset_changed_cb("MainRecordingStopRequest", callback));
}

TEST(SystemSettingsTest, DerivesClockFromTheRegionUntilTheDesktopSays)
{
    const struct {
        const char* region;
        bool is24;
    } regions[] = {{"en_US", false}, {"de_DE", true}, {"ko_KR", false}, {"fr_CA", true}, {"ja_JP", true}};
    bool is24 = false;
    for (const auto& entry : regions) {
        stateTree().write("db/menu_widget/regionformat", entry.region);
        EXPECT_EQ(0, system_settings_get_value_bool(SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR, &is24));
        EXPECT_EQ(entry.is24, is24) << entry.region;
    }
    int calls = 0;
    ASSERT_EQ(0,
        system_settings_set_changed_cb(
            SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR,
            [](system_settings_key_e key, void* data) {
                EXPECT_EQ(14, key);
                ++*static_cast<int*>(data);
            },
            &calls));
    stateTree().write("db/setting/clock_24h", "0");
    ASSERT_TRUE(runUntil([&] { return calls == 1; }));
    EXPECT_EQ(0, system_settings_get_value_bool(SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR, &is24));
    EXPECT_FALSE(is24);
    EXPECT_EQ(0, system_settings_unset_changed_cb(SYSTEM_SETTINGS_KEY_LOCALE_TIMEFORMAT_24HOUR));
}

TEST(SystemSettingsTest, TimeZoneComesFromKeyThenEnvironment)
{
    char* zone = nullptr;
    ::setenv("TZ", "Asia/Seoul", 1);
    ASSERT_EQ(0, system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE, &zone));
    EXPECT_EQ("Asia/Seoul", taken(zone));
    for (const auto& [variable, expected] : {std::pair(":Asia/Seoul", "Asia/Seoul"), {"UTC", "UTC"},
             {":/usr/share/zoneinfo/Asia/Seoul", "Asia/Seoul"}, {":/no/such/file", SYSTEM_SETTINGS_TIMEZONE_LOCAL},
             {"CET-1CEST,M3.5.0,M10.5.0/3", SYSTEM_SETTINGS_TIMEZONE_LOCAL}, {"XYZ-5", SYSTEM_SETTINGS_TIMEZONE_LOCAL},
             {"<+0545>-5:45", SYSTEM_SETTINGS_TIMEZONE_LOCAL}}) {
        ::setenv("TZ", variable, 1);
        ASSERT_EQ(0, system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE, &zone));
        EXPECT_EQ(expected, taken(zone)) << variable;
    }
    int calls = 0;
    ASSERT_EQ(0,
        system_settings_set_changed_cb(
            SYSTEM_SETTINGS_KEY_TIME_CHANGED, [](system_settings_key_e, void* data) { ++*static_cast<int*>(data); },
            &calls));
    stateTree().write("db/setting/timezone", "Europe/Berlin");
    ASSERT_TRUE(runUntil([&] { return calls == 1; }));
    stateTree().write("memory/time_changed", "1");
    ASSERT_TRUE(runUntil([&] { return calls == 2; }));
    ASSERT_EQ(0, system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_TIMEZONE, &zone));
    EXPECT_EQ("Europe/Berlin", taken(zone));
    EXPECT_EQ(0, system_settings_unset_changed_cb(SYSTEM_SETTINGS_KEY_TIME_CHANGED));
}

TEST(AppEventTest, LowBatteryIsLowOrCritical)
{
    int calls = 0;
    app_event_handler_h handler = nullptr;
    ASSERT_EQ(0,
        app_add_event_handler(
            &handler, APP_EVENT_LOW_BATTERY, [](app_event_info_h, void* data) { ++*static_cast<int*>(data); }, &calls));
    vconf_set_int(VCONFKEY_SYSMAN_BATTERY_STATUS_LOW, 3);
    runFor(0.05);
    EXPECT_EQ(0, calls);
    vconf_set_int(VCONFKEY_SYSMAN_BATTERY_STATUS_LOW, 2);
    ASSERT_TRUE(runUntil([&] { return calls == 1; }));
    EXPECT_EQ(0, app_remove_event_handler(handler));
}

TEST(AppEventTest, LanguageArrivesWithTheEvent)
{
    std::string language;
    app_event_handler_h handler = nullptr;
    ASSERT_EQ(0,
        app_add_event_handler(
            &handler, APP_EVENT_LANGUAGE_CHANGED,
            [](app_event_info_h info, void* data) {
                char* text = nullptr;
                EXPECT_EQ(0, app_event_get_language(info, &text));
                *static_cast<std::string*>(data) = taken(text);
            },
            &language));
    stateTree().write("db/menu_widget/language", "ko_KR");
    EXPECT_TRUE(runUntil([&] { return language == "ko_KR"; }));
    EXPECT_EQ(0, app_remove_event_handler(handler));
}

TEST(ResourceTest, AnswersOnlyFilesBelowTheDirectory)
{
    const support::TempDir directory;
    support::writeFile(directory.file("share/edje/MwButton.edj"), "x");
    support::writeFile(directory.file("secret.edj"), "x");
    ::setenv("MEWLO_RESOURCE_DIR", directory.file("share").c_str(), 1);
    char* path = app_get_resource_path();
    EXPECT_EQ(directory.file("share/"), taken(path));
    ASSERT_EQ(0, app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, "edje/MwButton.edj", &path));
    EXPECT_EQ(directory.file("share/edje/MwButton.edj"), taken(path));
    for (const std::string name :
        {"../secret.edj", "edje/../../secret.edj", "/etc/passwd", "", "edje", "edje/none.edj"}) {
        EXPECT_NE(0, app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, name.c_str(), &path)) << name;
    }
    ::setenv("MEWLO_RESOURCE_DIR", directory.file("absent").c_str(), 1);
    EXPECT_EQ(nullptr, app_get_resource_path());
    EXPECT_NE(0, app_resource_manager_init());
}

TEST(DirectoriesTest, RuntimeDirectoryInTmpIsOursAlone)
{
    EXPECT_EQ(std::string(::getenv("XDG_RUNTIME_DIR")) + "/com.tovanic.mewlo-lite", platform::runtimeDirectory());
    const std::string session = ::getenv("XDG_RUNTIME_DIR");
    ::unsetenv("XDG_RUNTIME_DIR");
    const std::string fallback = platform::runtimeDirectory();
    struct stat info = {};
    EXPECT_TRUE(fallback.starts_with("/tmp/com.tovanic.mewlo-lite-"));
    ASSERT_EQ(0, ::lstat(fallback.c_str(), &info));
    EXPECT_EQ(0700U, info.st_mode & 0777U);
    EXPECT_EQ(::geteuid(), info.st_uid);
    // A directory that is open to others is not trusted.
    ::setenv("XDG_RUNTIME_DIR", session.c_str(), 1);
    ::chmod((session + "/com.tovanic.mewlo-lite").c_str(), 0777);
    EXPECT_EQ("", platform::runtimeDirectory());
    ::chmod((session + "/com.tovanic.mewlo-lite").c_str(), 0700);
}

}
