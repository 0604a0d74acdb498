// State keys that the services define themselves. The application's own are in vconf.h.
#pragma once

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
constexpr auto KEY_RECORDER_STATE = "memory/mewlo/recorder_state"; // 0 none, 1 ready, 2 recording, 3 paused
constexpr auto KEY_TITLE = "memory/mewlo/title"; // of what is recorded or played, for remote controls
constexpr auto KEY_LOCKS = "memory/mewlo/locks/"; // + process id: held power locks, separated by blanks

}
