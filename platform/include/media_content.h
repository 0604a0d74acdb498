// The media database: one row a recording, with bookmarks. Any thread. Texts answered by a get are newly allocated.
// Conditions are SQL expressions over MEDIA_ID, MEDIA_PATH, MEDIA_DISPLAY_NAME, MEDIA_MIME_TYPE, MEDIA_MODE,
// MEDIA_STORAGE, MEDIA_SIZE, MEDIA_ADDED_TIME, MEDIA_MODIFIED_TIME, MEDIA_TIMELINE, MEDIA_DURATION (and
// BOOKMARK_MARKED_TIME); a text put into one must be escaped with media_content_escape.
#pragma once

#include <ctime>

enum media_content_error_e : int {
    MEDIA_CONTENT_ERROR_NONE = 0,
    MEDIA_CONTENT_ERROR_INVALID_PARAMETER = -22,
    MEDIA_CONTENT_ERROR_OUT_OF_MEMORY = -12,
    MEDIA_CONTENT_ERROR_INVALID_OPERATION = -38,
    MEDIA_CONTENT_ERROR_DB_FAILED = static_cast<int>(0xFE680001u),
    MEDIA_CONTENT_ERROR_DB_BUSY = static_cast<int>(0xFE680002u),
};
enum media_content_order_e { MEDIA_CONTENT_ORDER_ASC = 0, MEDIA_CONTENT_ORDER_DESC = 1 };
enum media_content_collation_e { MEDIA_CONTENT_COLLATE_DEFAULT = 0, MEDIA_CONTENT_COLLATE_NOCASE = 1 };
enum media_content_db_update_item_type_e { MEDIA_ITEM_FILE = 0, MEDIA_ITEM_DIRECTORY = 1 };
enum media_content_db_update_type_e { MEDIA_CONTENT_INSERT = 0, MEDIA_CONTENT_DELETE = 1, MEDIA_CONTENT_UPDATE = 2 };
enum media_content_type_e { MEDIA_CONTENT_TYPE_OTHERS = 4, MEDIA_CONTENT_TYPE_SOUND = 2, MEDIA_CONTENT_TYPE_MUSIC = 3 };

typedef struct media_info_s* media_info_h;
typedef struct audio_meta_s* audio_meta_h;
typedef struct filter_s* filter_h;
typedef struct files_lock_s* files_lock_h;
typedef struct media_bookmark_s* media_bookmark_h;
typedef struct {
    unsigned int marked_time; // seconds
    const char* name;
} media_bookmark_entry_s;
typedef bool (*media_info_cb)(media_info_h media, void* user_data);
typedef bool (*media_bookmark_cb)(media_bookmark_h bookmark, void* user_data);
// Runs on the main loop after a commit of any process; uuid, path and mime may be null.
typedef void (*media_content_db_updated_cb)(media_content_error_e error, int pid,
    media_content_db_update_item_type_e item, media_content_db_update_type_e type, media_content_type_e media_type,
    char* uuid, char* path, char* mime, void* user_data);

extern "C" {
// Connections are counted. The database is opened in the background; a database that cannot be opened fails the calls
// that need it. A damaged database is set aside under another name and rebuilt from the files.
int media_content_connect(void);
int media_content_disconnect(void);
// While a callback is set, what other programs do to the files in the recordings folders is catalogued as well, within
// about half a second. Main loop.
int media_content_set_db_updated_cb(media_content_db_updated_cb callback, void* user_data);
int media_content_unset_db_updated_cb(void);
// Catalogues the files of a directory that the database does not know and drops the rows whose file is gone.
// added and removed may be null.
int media_content_scan_folder(const char* directory, int* added, int* removed);
// The same for all recordings folders at once: a file that moved keeps its row and bookmarks, and one that did not tell
// its length is asked again.
int media_content_scan_all(void);
// Catalogues one file anew, or drops its row when it is gone.
int media_content_scan_file(const char* path);
// Hold while changing a file together with its row (briefly), so that no scan of any process sees one without the
// other. Waits for others up to ten seconds, then answers DB_BUSY: not on the main loop. Free it on any thread.
int media_content_lock_files(files_lock_h* lock);
int media_content_unlock_files(files_lock_h lock);
// Doubles quotes and drops what ends a condition text; newly allocated, to be put between double quotes.
char* media_content_escape(const char* text);

int media_filter_create(filter_h* filter);
int media_filter_destroy(filter_h filter);
int media_filter_set_condition(filter_h filter, const char* condition, media_content_collation_e collation);
int media_filter_set_order(
    filter_h filter, media_content_order_e order, const char* keyword, media_content_collation_e collation);
int media_filter_set_offset(filter_h filter, int offset, int count);

// The handle given to a callback is borrowed for the call. Recordings on a card that is out are left out.
int media_info_foreach_media_from_db(filter_h filter, media_info_cb callback, void* user_data);
int media_info_foreach_media_from_db_with_media_mode(filter_h filter, media_info_cb callback, void* user_data);
// Inserts (or refreshes) the row of a file; the handle is the caller's.
int media_info_insert_to_db(const char* path, media_info_h* media);
// The row of an identifier; the handle is the caller's.
int media_info_get_media_from_db(const char* media_id, media_info_h* media);
int media_info_delete_from_db(const char* media_id);
// Several rows in one commit: all or none.
int media_info_delete_list_from_db(const char* const* media_ids, int count);
int media_info_move_to_db(media_info_h media, const char* path);
// A recording and its bookmarks in one commit, all or nothing: the row old_media_id (null for none) goes with its
// bookmarks, the file at path gets a row, under a new identifier, with these. A row that path already has goes as well.
// new_media_id may be null, else it is newly allocated. Everything else is borrowed for the call.
int media_info_replace_in_db(const char* old_media_id, const char* path, const media_bookmark_entry_s* bookmarks,
    int count, char** new_media_id);
int media_info_destroy(media_info_h media);
int media_info_get_media_id(media_info_h media, char** media_id);
int media_info_get_file_path(media_info_h media, char** path);
int media_info_get_display_name(media_info_h media, char** name);
int media_info_get_modified_time(media_info_h media, time_t* time);
int media_info_get_audio(media_info_h media, audio_meta_h* audio);
// 0 when the file does not tell.
int audio_meta_get_duration(audio_meta_h audio, int* milliseconds);
int audio_meta_destroy(audio_meta_h audio);

int media_bookmark_insert_to_db(const char* media_id, unsigned int marked_time, const char* name);
// Those whose time has no bookmark yet, in one commit, all or nothing.
int media_bookmark_insert_missing_to_db(const char* media_id, const media_bookmark_entry_s* bookmarks, int count);
int media_bookmark_delete_from_db(int bookmark_id);
int media_info_get_bookmark_count_from_db(const char* media_id, filter_h filter, int* count);
int media_info_foreach_bookmark_from_db(
    const char* media_id, filter_h filter, media_bookmark_cb callback, void* user_data);
int media_bookmark_get_bookmark_id(media_bookmark_h bookmark, int* id);
int media_bookmark_get_marked_time(media_bookmark_h bookmark, unsigned int* time);
// Answers the name of the bookmark, which has no picture.
int media_bookmark_get_thumbnail_path(media_bookmark_h bookmark, char** name);
}
