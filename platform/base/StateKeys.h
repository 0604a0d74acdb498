// The names of all state keys (see vconf.h) and what their values are.
#pragma once

// Those that the application reads or writes.
#define VCONFKEY_SYSMAN_MMC_STATUS "memory/sysman/mmc"
#define VCONFKEY_IDLE_LOCK_STATE "memory/idle_lock/state"
#define VCONFKEY_SYSMAN_POWER_OFF_STATUS "memory/sysman/power_off"
#define VCONFKEY_SETAPPL_PSMODE "db/setting/psmode"
#define VCONFKEY_SYSMAN_EARJACK "memory/sysman/earjack"
#define VCONFKEY_CALL_RECORDING_REJECT "memory/call/recording_reject"
#define VCONFKEY_SYSMAN_BATTERY_STATUS_LOW "memory/sysman/battery_status_low"
// Written by the application: what it records (recorder states 0 none, 1 ready, 2 recording, 3 paused) and the name of
// what is recorded or played. Remote controls show them, and the shut-down waits for a recording.
#define VCONFKEY_MEWLO_RECORDER_STATE "memory/mewlo/recorder_state"
#define VCONFKEY_MEWLO_TITLE "memory/mewlo/title"
#define VCONFKEY_PRIVATE_STORAGE_OPEN "memory/setting/personal" // bool
#define VCONFKEY_MEWLO_MICROPHONE "memory/mewlo/microphone" // 0 none there, 1 there

// Those of the services alone.
namespace platform {

constexpr auto KEY_CALL_STATUS = "memory/telephony/call_status"; // number of live calls
constexpr auto KEY_DISPLAY_STATE = "memory/device/display_state"; // display_state_e
constexpr auto KEY_TIME_ZONE = "db/setting/timezone"; // "Europe/Berlin"
constexpr auto KEY_CLOCK_24H = "db/setting/clock_24h"; // 0, 1
constexpr auto KEY_THEME = "db/setting/theme"; // "light", "dark"
constexpr auto KEY_CARD_PATH = "memory/storage/card_path"; // valid while the card is mounted
constexpr auto KEY_TIME_CHANGED = "memory/time_changed"; // seconds of the clock after a step
constexpr auto KEY_LANGUAGE = "db/menu_widget/language"; // "de_DE"
constexpr auto KEY_REGION = "db/menu_widget/regionformat"; // "de_DE"
constexpr auto KEY_PRIVATE_METHOD = "db/setting/personal_unlock_method"; // 0 the private storage is not set up
constexpr auto KEY_LOCKS = "memory/mewlo/locks/"; // + process id: held power locks, separated by blanks

}
