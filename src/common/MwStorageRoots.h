// Where recordings live: the roots of the device storage, the memory card and the private storage.
#pragma once

#include <storage.h>

#include <string>

inline std::string mwDeviceRoot() { return storage_device_root(); }
inline std::string mwCardRoot() { return storage_card_root(); }
inline std::string mwPrivateRoot() { return storage_private_root(); }

inline constexpr auto TEMP_FILE_NAME = ".mw_temp";
