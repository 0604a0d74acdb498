// Where recordings live and how much room is left. Any thread.
#pragma once

#include <sys/statvfs.h>

inline constexpr auto RECORDINGS_DIRECTORY = "Sounds/Mewlo"; // below each root

extern "C" {
int storage_get_internal_memory_size(struct statvfs* size);
int storage_get_external_memory_size(struct statvfs* size);

// Storage roots, borrowed for the life of the process: MEWLO_DEVICE_ROOT, MEWLO_CARD_ROOT and MEWLO_PRIVATE_ROOT,
// else the fixed path where it may be written, else the desktop's own place. Device and private root are resolved
// once; the card root on every call (the answer stays valid until the next call on the same thread).
const char* storage_device_root(void);
const char* storage_card_root(void);
const char* storage_private_root(void);

// Deletes a file into the desktop's trash. Never deletes for good: -ENOTSUP where its file system has no trash, else 0
// or a negative error number.
int storage_trash_file(const char* path);
// Moves a file, whatever it is called now, into the desktop's trash as if it had been deleted from the path `original`.
// Never copies and never deletes: -ENOTSUP where its file system has no trash, else 0 or a negative error number.
int storage_move_to_trash(const char* path, const char* original);
}
