#include "callmgr.h"
#include "device.h"
#include "doctor.h"
#include "host/BatteryWatch.h"
#include "host/CallWatch.h"
#include "host/DisplayServer.h"
#include "host/LocaleWatch.h"
#include "host/LogindWatch.h"
#include "host/MountWatch.h"
#include "host/PortalWatch.h"
#include "host/ScreenSaverWatch.h"
#include "host/TimeWatch.h"
#include "state_keys.h"
#include "vconf.h"

#include "support/DbusMock.h"
#include "support/PrivateBus.h"
#include "support/RunUntil.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <map>

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace {

using support::BusKind;
using support::DbusMock;
using support::PrivateBus;
using support::runUntil;

constexpr auto LOCK = "memory/idle_lock/state";
constexpr auto CALLS = "memory/telephony/call_status";

class HostTest : public testing::Test {
protected:
    void SetUp() override
    {
        if (!DbusMock::isInstalled())
            GTEST_SKIP() << "python3-dbusmock is missing";
    }
    ~HostTest() override { host::closeBuses(); }

    host::KeySink sink()
    {
        return [this](const std::string& key, const std::string& value) {
            ++_reports;
            _keys[key] = value;
        };
    }
    bool becomes(const std::string& key, const std::string& value)
    {
        return runUntil([&] { return _keys.contains(key) && _keys[key] == value; }, 20);
    }

    PrivateBus _session{BusKind::SESSION};
    PrivateBus _system{BusKind::SYSTEM};
    std::map<std::string, std::string> _keys;
    int _reports = 0;
};

TEST_F(HostTest, LockAndShutdownComeFromLogind)
{
    ::setenv("XDG_SESSION_ID", "c7", 1);
    DbusMock logind(_system, BusKind::SYSTEM, "org.freedesktop.login1", {"--template", "logind"});
    ASSERT_TRUE(logind.control("/org/freedesktop/login1", "AddSession", "ssusb", "c7", "seat0", ::getuid(), "user", 1));
    const std::string session = "/org/freedesktop/login1/session/c7";
    host::LogindWatch watch(sink());
    watch.start();
    ASSERT_TRUE(becomes(LOCK, "0"));
    const auto setLocked = [&](int locked) {
        return logind.control(
            session, "UpdateProperties", "sa{sv}", "org.freedesktop.login1.Session", 1, "LockedHint", "b", locked);
    };
    ASSERT_TRUE(setLocked(1));
    ASSERT_TRUE(becomes(LOCK, "1"));
    ASSERT_TRUE(setLocked(0));
    ASSERT_TRUE(becomes(LOCK, "0"));

    const auto shutDown = [&](int begins) {
        return logind.control("/org/freedesktop/login1", "EmitSignal", "sssav", "org.freedesktop.login1.Manager",
            "PrepareForShutdown", "b", 1, "b", begins);
    };
    ASSERT_TRUE(shutDown(1));
    ASSERT_TRUE(becomes("memory/sysman/power_off", "2"));
    ASSERT_TRUE(shutDown(0)); // called off
    ASSERT_TRUE(becomes("memory/sysman/power_off", "0"));

    watch.stop();
    ASSERT_TRUE(setLocked(1));
    support::runFor(0.1);
    EXPECT_EQ("0", _keys[LOCK]);
    ::unsetenv("XDG_SESSION_ID");
}

int inhibitors(sd_bus* bus, const std::string& what, const std::string& mode)
{
    sd_bus_message* reply = nullptr;
    int count = 0;
    sd_bus_call_method(bus, "org.freedesktop.login1", "/org/freedesktop/login1", "org.freedesktop.login1.Manager",
        "ListInhibitors", nullptr, &reply, "");
    const host::Message keeper(reply);
    if (reply == nullptr || sd_bus_message_enter_container(reply, 'a', "(ssssuu)") < 0)
        return -1;
    const char *entryWhat, *who, *why, *entryMode;
    uint32_t user, process;
    while (sd_bus_message_read(reply, "(ssssuu)", &entryWhat, &who, &why, &entryMode, &user, &process) > 0)
        count += entryWhat == what && entryMode == mode ? 1 : 0;
    return count;
}

std::string heldLocks()
{
    std::string all;
    power_locks_list(
        [](int process, const char* locks, void* data) {
            EXPECT_EQ(::getpid(), process);
            *static_cast<std::string*>(data) += locks;
        },
        &all);
    return all;
}

TEST_F(HostTest, PowerLocksAreInhibitorsOfLogindAndScreenSaver)
{
    DbusMock logind(_system, BusKind::SYSTEM, "org.freedesktop.login1", {"--template", "logind"});
    constexpr auto SAVER = "org.freedesktop.ScreenSaver";
    constexpr auto SAVER_PATH = "/org/freedesktop/ScreenSaver";
    DbusMock saver(_session, BusKind::SESSION, SAVER, {SAVER, SAVER_PATH, SAVER});
    saver.control(SAVER_PATH, "AddMethod", "sssss", SAVER, "Inhibit", "ss", "u", "ret = dbus.UInt32(7)");
    saver.control(SAVER_PATH, "AddMethod", "sssss", SAVER, "UnInhibit", "u", "", "");
    saver.control(SAVER_PATH, "AddMethod", "sssss", SAVER, "SimulateUserActivity", "", "", "");
    sd_bus* bus = host::systemBus()->get();

    EXPECT_EQ(0, device_power_request_lock(POWER_LOCK_CPU, 0));
    EXPECT_EQ(0, device_power_request_lock(POWER_LOCK_CPU, 0)); // no second lock
    EXPECT_EQ(0, device_power_request_lock(POWER_LOCK_DISPLAY_DIM, 0));
    EXPECT_EQ("cpu display_dim", heldLocks());
    EXPECT_TRUE(
        runUntil([&] { return inhibitors(bus, "sleep", "block") == 1 && inhibitors(bus, "idle", "block") == 1; }, 20));
    EXPECT_TRUE(runUntil([&] { return saver.callsOf(SAVER_PATH, "Inhibit") == 1; }, 20));
    EXPECT_EQ(0, device_power_wakeup(false));
    EXPECT_TRUE(runUntil([&] { return saver.callsOf(SAVER_PATH, "SimulateUserActivity") == 1; }, 20));
    support::runFor(0.05); // the cookie of the screen saver is on its way

    EXPECT_EQ(0, device_power_release_lock(POWER_LOCK_CPU));
    EXPECT_EQ(0, device_power_release_lock(POWER_LOCK_DISPLAY_DIM));
    EXPECT_TRUE(
        runUntil([&] { return inhibitors(bus, "sleep", "block") == 0 && inhibitors(bus, "idle", "block") == 0; }, 20));
    EXPECT_TRUE(runUntil([&] { return saver.callsOf(SAVER_PATH, "UnInhibit") == 1; }, 20));
    EXPECT_EQ("", heldLocks());

    EXPECT_EQ(0, device_power_request_lock(POWER_LOCK_CPU, 50)); // for a while
    EXPECT_TRUE(runUntil([] { return heldLocks().empty(); }));
    EXPECT_NE(0, device_power_request_lock(static_cast<power_lock_e>(3), 0));
    EXPECT_NE(0, device_power_request_lock(POWER_LOCK_CPU, -1));

    host::LogindWatch watch(sink());
    watch.setBusy(true);
    EXPECT_TRUE(runUntil([&] { return inhibitors(bus, "shutdown", "delay") == 1; }, 20));
    watch.setBusy(false);
    EXPECT_TRUE(runUntil([&] { return inhibitors(bus, "shutdown", "delay") == 0; }, 20));
}

TEST_F(HostTest, BatteryWarningsBecomeLevels)
{
    DbusMock upower(_system, BusKind::SYSTEM, "org.freedesktop.UPower",
        {"--template", "upower", "--parameters", "{\"DaemonVersion\": \"0.99.20\", \"OnBattery\": true}"});
    host::BatteryWatch watch(sink());
    watch.start();
    for (const auto& [warning, level] : {std::pair(1U, "3"), {3U, "2"}, {4U, "1"}, {5U, "1"}, {2U, "3"}}) {
        SCOPED_TRACE(warning);
        ASSERT_TRUE(upower.control("/org/freedesktop/UPower/devices/DisplayDevice", "UpdateProperties", "sa{sv}",
            "org.freedesktop.UPower.Device", 1, "WarningLevel", "u", warning));
        EXPECT_TRUE(becomes("memory/sysman/battery_status_low", level));
    }
}

TEST_F(HostTest, TimeZoneComesFromTimedate)
{
    DbusMock timedate(_system, BusKind::SYSTEM, "org.freedesktop.timedate1", {"--template", "timedated"});
    host::TimeWatch watch(sink());
    watch.start();
    ASSERT_TRUE(
        timedate.call("/org/freedesktop/timedate1", "org.freedesktop.timedate1", "SetTimezone", "sb", "Asia/Seoul", 0));
    EXPECT_TRUE(becomes("db/setting/timezone", "Asia/Seoul"));
}

TEST_F(HostTest, PortalGivesThemeAndClock)
{
    constexpr auto PORTAL = "org.freedesktop.portal.Desktop";
    constexpr auto PATH = "/org/freedesktop/portal/desktop";
    constexpr auto SETTINGS = "org.freedesktop.portal.Settings";
    DbusMock portal(_session, BusKind::SESSION, PORTAL, {PORTAL, PATH, SETTINGS});
    // A variant in a variant, as portals answer.
    portal.control(PATH, "AddMethod", "sssss", SETTINGS, "Read", "ss", "v",
        "ret = dbus.UInt32(1, variant_level=2) if args[1] == 'color-scheme' else dbus.String('12h', variant_level=1)");
    host::PortalWatch watch(sink());
    watch.start();
    ASSERT_TRUE(becomes("db/setting/theme", "dark"));
    ASSERT_TRUE(becomes("db/setting/clock_24h", "0"));
    const int before = _reports;
    portal.control(PATH, "EmitSignal", "sssav", SETTINGS, "SettingChanged", "ssv", 3, "s", "org.example", "s",
        "color-scheme", "u", 1U);
    portal.control(PATH, "EmitSignal", "sssav", SETTINGS, "SettingChanged", "ssv", 3, "s", "org.freedesktop.appearance",
        "s", "color-scheme", "u", 2U);
    portal.control(PATH, "EmitSignal", "sssav", SETTINGS, "SettingChanged", "ssv", 3, "s",
        "org.gnome.desktop.interface", "s", "clock-format", "s", "24h");
    EXPECT_TRUE(becomes("db/setting/theme", "light"));
    EXPECT_TRUE(becomes("db/setting/clock_24h", "1"));
    EXPECT_EQ(before + 2, _reports);
}

TEST_F(HostTest, CallsAreCountedAndRejectedOnDemand)
{
    constexpr auto MODEM_MANAGER = "org.freedesktop.ModemManager1";
    constexpr auto ROOT = "/org/freedesktop/ModemManager1";
    constexpr auto MODEM = "/org/freedesktop/ModemManager1/Modem/0";
    constexpr auto CALL = "/org/freedesktop/ModemManager1/Call/3";
    constexpr auto VOICE = "org.freedesktop.ModemManager1.Modem.Voice";
    constexpr auto CALL_INTERFACE = "org.freedesktop.ModemManager1.Call";
    DbusMock modems(
        _system, BusKind::SYSTEM, MODEM_MANAGER, {"--is-object-manager", MODEM_MANAGER, ROOT, MODEM_MANAGER});
    ASSERT_TRUE(modems.control(ROOT, "AddObject", "ssa{sv}a(ssss)", MODEM, VOICE, 0, 1, "ListCalls", "", "ao",
        "ret = dbus.Array(['/org/freedesktop/ModemManager1/Call/3'], signature='o')"));
    ASSERT_TRUE(modems.control(
        ROOT, "AddObject", "ssa{sv}a(ssss)", CALL, CALL_INTERFACE, 1, "State", "i", 4, 1, "Hangup", "", "", ""));
    bool rejects = false;
    host::CallWatch watch(sink(), [&] { return rejects; });
    watch.start();
    ASSERT_TRUE(becomes(CALLS, "1")); // one was there before us
    const auto setState = [&](int before, int state) {
        return modems.control(
            CALL, "EmitSignal", "sssav", CALL_INTERFACE, "StateChanged", "iiu", 3, "i", before, "i", state, "u", 0U);
    };
    const auto announce = [&](const char* signal) {
        return modems.control(MODEM, "EmitSignal", "sssav", VOICE, signal, "o", 1, "o", CALL);
    };
    ASSERT_TRUE(setState(4, 7));
    ASSERT_TRUE(becomes(CALLS, "0"));
    ASSERT_TRUE(announce("CallAdded") && setState(0, 3));
    ASSERT_TRUE(becomes(CALLS, "1"));
    support::runFor(0.1);
    EXPECT_EQ(0, modems.callsOf(CALL, "Hangup"));
    ASSERT_TRUE(announce("CallDeleted"));
    ASSERT_TRUE(becomes(CALLS, "0"));
    rejects = true;
    ASSERT_TRUE(announce("CallAdded") && setState(0, 3));
    EXPECT_TRUE(runUntil([&] { return modems.callsOf(CALL, "Hangup") == 1; }, 20));
    watch.stop();
    ASSERT_TRUE(modems.control(CALL, "UpdateProperties", "sa{sv}", CALL_INTERFACE, 1, "State", "i", 3));
    watch.start();
    EXPECT_TRUE(runUntil([&] { return modems.callsOf(CALL, "Hangup") == 2; }, 20)) << "it rang before we looked";
}

TEST_F(HostTest, ScreenSaverLocks)
{
    DbusMock saver(_session, BusKind::SESSION, "org.gnome.ScreenSaver", {"--template", "gnome_screensaver"});
    host::ScreenSaverWatch watch(sink());
    watch.start();
    ASSERT_TRUE(host::hasOwner(host::sessionBus()->get(), "org.gnome.ScreenSaver")); // so the bus knows our match
    saver.call("/org/gnome/ScreenSaver", "org.gnome.ScreenSaver", "SetActive", "b", 1);
    ASSERT_TRUE(becomes(LOCK, "1"));
    saver.call("/org/gnome/ScreenSaver", "org.gnome.ScreenSaver", "SetActive", "b", 0);
    EXPECT_TRUE(becomes(LOCK, "0"));
}

TEST_F(HostTest, SystemLocaleFillsWhatTheEnvironmentLeavesOpen)
{
    constexpr auto LOCALE = "org.freedesktop.locale1";
    constexpr auto PATH = "/org/freedesktop/locale1";
    DbusMock locale(_system, BusKind::SYSTEM, LOCALE, {LOCALE, PATH, LOCALE});
    locale.control(PATH, "AddProperty", "ssv", LOCALE, "Locale", "as", 2, "LANG=de_DE.UTF-8", "LC_TIME=en_GB.UTF-8");
    for (const char* name : {"LANGUAGE", "LC_ALL", "LC_MESSAGES", "LC_TIME", "LANG"})
        ::unsetenv(name);
    host::LocaleWatch watch(sink());
    watch.start();
    EXPECT_TRUE(becomes("db/menu_widget/language", "de_DE"));
    EXPECT_TRUE(becomes("db/menu_widget/regionformat", "en_GB"));
    locale.control(PATH, "UpdateProperties", "sa{sv}", LOCALE, 1, "Locale", "as", 1, "LANG=ko_KR.UTF-8");
    EXPECT_TRUE(becomes("db/menu_widget/regionformat", "ko_KR"));
    watch.stop();
    ::setenv("LC_ALL", "ar_EG.UTF-8", 1);
    watch.start();
    EXPECT_EQ("ar_EG", _keys["db/menu_widget/language"]);
    watch.stop();
    ::setenv("LC_ALL", "C.UTF-8", 1);
}

TEST(LocaleTest, DropsCodesetAndModifier)
{
    for (const auto& [locale, plain] : {std::pair("en_GB.UTF-8", "en_GB"), {"de_DE@euro", "de_DE"},
             {"C.UTF-8", "en_US"}, {"POSIX", "en_US"}, {"", "en_US"}, {"ko", "ko"}, {"de_AT:en", "de_AT"}})
        EXPECT_EQ(plain, host::LocaleWatch::plainLocale(locale)) << locale;
    for (const auto& [locale, region] : {std::pair("sr_RS.UTF-8@latin", "sr_Latn_RS"), {"uz_UZ@cyrillic", "uz_Cyrl_UZ"},
             {"ks_IN@devanagari:en", "ks_Deva_IN"}, {"sr@latin", "sr_Latn"}, {"de_DE@euro", "de_DE"}, {"C", "en_US"}})
        EXPECT_EQ(region, host::LocaleWatch::regionOf(locale)) << locale;
}

TEST(MountTest, FindsTheFirstWritableCard)
{
    const std::vector<std::string> places = {"/run/media/ann", "/media/ann"};
    const std::string root = "22 1 8:1 / / rw,relatime shared:1 - ext4 /dev/sda1 rw\n";
    const auto line = [](const std::string& point, const std::string& options) {
        return "90 22 8:17 / " + point + " " + options + ",nosuid shared:52 - vfat /dev/sdb1 rw\n";
    };
    EXPECT_FALSE(host::MountWatch::findCard(root, places).has_value());
    EXPECT_FALSE(host::MountWatch::findCard(root + line("/run/media/bob/STICK", "rw"), places).has_value());
    EXPECT_FALSE(host::MountWatch::findCard(root + line("/run/media/ann", "rw"), places).has_value());
    EXPECT_EQ("/media/ann/B",
        host::MountWatch::findCard(root + line("/run/media/ann/A", "ro") + line("/media/ann/B", "rw"), places));
    EXPECT_EQ("/run/media/ann/MY CARD", host::MountWatch::findCard(line("/run/media/ann/MY\\040CARD", "rw"), places));
    EXPECT_FALSE(host::MountWatch::findCard("broken line\n\n", places).has_value());
}

TEST(MountTest, ReportsAtTheStartAndStopsAtOnce)
{
    std::vector<std::string> reports;
    host::MountWatch watch(
        [&](const std::string& key, const std::string& value) { reports.push_back(key + "=" + value); },
        {"/nonexistent/place"});
    watch.start();
    EXPECT_EQ(std::vector<std::string>{"memory/sysman/mmc=0"}, reports);
    watch.stop();
    watch.start();
    watch.stop();
    EXPECT_EQ(2U, reports.size());
}

// With no bus at all, and with buses on which nobody answers.
TEST(HostlessTest, WatchersStartAndStaySilent)
{
    for (const bool withBuses : {false, true}) {
        SCOPED_TRACE(withBuses);
        std::vector<std::unique_ptr<PrivateBus>> buses;
        if (withBuses)
            for (const BusKind kind : {BusKind::SESSION, BusKind::SYSTEM})
                buses.push_back(std::make_unique<PrivateBus>(kind));
        host::closeBuses();
        int reports = 0;
        const host::KeySink sink = [&](const std::string&, const std::string&) { ++reports; };
        host::LogindWatch logind(sink);
        host::BatteryWatch battery(sink);
        host::TimeWatch time(sink);
        host::PortalWatch portal(sink);
        host::CallWatch calls(sink, [] { return true; });
        host::ScreenSaverWatch saver(sink);
        logind.start();
        battery.start();
        time.start();
        portal.start();
        calls.start();
        saver.start();
        logind.setBusy(true);
        EXPECT_EQ(0, device_power_request_lock(POWER_LOCK_DISPLAY_DIM, 0));
        support::runFor(0.2);
        EXPECT_EQ(0, device_power_release_lock(POWER_LOCK_DISPLAY_DIM));
        EXPECT_EQ(0, reports);
        for (const auto& bus : buses)
            bus->stop();
        support::runFor(0.1);
        EXPECT_EQ(0, device_power_request_lock(POWER_LOCK_CPU, 0));
        EXPECT_EQ(0, device_power_release_lock(POWER_LOCK_CPU));
        logind.unlock();
        host::closeBuses();
    }
}

TEST(HostlessTest, DoctorNamesWhatIsMissing)
{
    host::closeBuses();
    std::map<std::string, std::string> fallbacks;
    const int missing = platform_doctor(
        [](const char* service, const char*, const char* fallback, void* data) {
            (*static_cast<std::map<std::string, std::string>*>(data))[service] = fallback;
        },
        &fallbacks);
    EXPECT_NE("", fallbacks["session bus"]);
    EXPECT_NE("", fallbacks["logind"]);
    EXPECT_EQ("", fallbacks["state keys"]);
    EXPECT_EQ("", fallbacks["device storage"]);
    EXPECT_GE(missing, 7);
}

TEST(DisplayServerTest, IsACompositorThatAnswersBeforeAnXServer)
{
    const support::TempDir directory;
    const auto listenAt = [](const std::string& path) {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        path.copy(address.sun_path, sizeof address.sun_path - 1);
        const int server = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
        EXPECT_EQ(0, ::bind(server, reinterpret_cast<sockaddr*>(&address), sizeof address));
        EXPECT_EQ(0, ::listen(server, 5));
        return server;
    };
    const int server = listenAt(directory.file("wayland-0"));
    ::close(listenAt(directory.file("wayland-dead")));
    struct Case {
        const char* chosen;
        std::string compositor;
        const char* display;
        const char* expected;
    };
    std::map<const char*, std::string> former;
    for (const char* name : {"XDG_RUNTIME_DIR", "ELM_DISPLAY", "WAYLAND_DISPLAY", "DISPLAY"})
        former[name] = std::getenv(name) != nullptr ? std::getenv(name) : "";
    ::setenv("XDG_RUNTIME_DIR", directory.path().c_str(), 1);
    for (const Case& each : {Case{"", "wayland-0", ":0", "wl"}, Case{"", directory.file("wayland-0"), "", "wl"},
             Case{"", "wayland-dead", ":0", "x11"}, Case{"", "wayland-none", ":0", "x11"}, Case{"", "", ":0", "x11"},
             Case{"", "wayland-dead", "", ""}, Case{"x11", "wayland-0", ":0", "x11"},
             Case{"buffer", "wayland-0", "", "buffer"}}) {
        ::setenv("ELM_DISPLAY", each.chosen, 1);
        ::setenv("WAYLAND_DISPLAY", each.compositor.c_str(), 1);
        ::setenv("DISPLAY", each.display, 1);
        EXPECT_EQ(each.expected, host::displayServer()) << each.compositor << " " << each.display;
    }
    for (const auto& [name, value] : former)
        ::setenv(name, value.c_str(), 1);
    ::close(server);
}

TEST(CallManagerTest, AnswersTheNumberOfCalls)
{
    cm_client_h client = nullptr;
    ASSERT_EQ(0, cm_init(&client));
    for (const int calls : {2, 0}) {
        cm_call_status_e status = CM_CALL_STATUS_IDLE;
        vconf_set_int(CALLS, calls);
        EXPECT_EQ(0, cm_get_call_status(client, &status));
        EXPECT_EQ(calls, static_cast<int>(status));
    }
    EXPECT_EQ(0, cm_deinit(client));
}

TEST(DisplayTest, TellsTheStateUntilRemoved)
{
    int last = -1;
    const device_changed_cb callback = [](device_callback_e, void* value, void* data) {
        *static_cast<int*>(data) = static_cast<int>(reinterpret_cast<intptr_t>(value));
    };
    ASSERT_EQ(0, device_add_callback(DEVICE_CALLBACK_DISPLAY_STATE, callback, &last));
    vconf_set_int("memory/device/display_state", 2);
    ASSERT_TRUE(runUntil([&] { return last == DISPLAY_STATE_SCREEN_OFF; }));
    display_state_e state = DISPLAY_STATE_NORMAL;
    EXPECT_EQ(0, device_display_get_state(&state));
    EXPECT_EQ(DISPLAY_STATE_SCREEN_OFF, state);
    vconf_set_int("memory/device/display_state", 17); // nothing we know
    EXPECT_TRUE(runUntil([&] { return last == DISPLAY_STATE_NORMAL; }));
    EXPECT_EQ(0, device_remove_callback(DEVICE_CALLBACK_DISPLAY_STATE, callback));
    EXPECT_NE(0, device_remove_callback(DEVICE_CALLBACK_DISPLAY_STATE, callback));
}

}
