#include "MwSavedBookmarks.h"

#include <media_content.h>

#include <utility>

#include "MwHandle.h"
#include "MwText.h"

namespace {

struct Reading {
    std::vector<MwSavedBookmark> bookmarks;
    MwBookmarkFailure failed;
};

bool succeeded(const Reading& reading, const char* call, int code)
{
    if (code != MEDIA_CONTENT_ERROR_NONE)
        reading.failed(call, code);
    return code == MEDIA_CONTENT_ERROR_NONE;
}

bool collectCb(media_bookmark_h handle, void* userData)
{
    auto* reading = static_cast<Reading*>(userData);
    MwSavedBookmark bookmark;
    char* name = nullptr;
    if (!succeeded(*reading, "media_bookmark_get_bookmark_id", media_bookmark_get_bookmark_id(handle, &bookmark.id))
        || !succeeded(
            *reading, "media_bookmark_get_marked_time", media_bookmark_get_marked_time(handle, &bookmark.markedTime))
        || !succeeded(*reading, "media_bookmark_get_thumbnail_path", media_bookmark_get_thumbnail_path(handle, &name)))
        return true;
    bookmark.name = mwAdopt(name);
    reading->bookmarks.push_back(std::move(bookmark));
    return true;
}

}

std::vector<MwSavedBookmark> mwReadBookmarks(const std::string& mediaId, MwBookmarkFailure failed)
{
    Reading reading{{}, failed};
    MwHandle<filter_h, media_filter_destroy> filter;
    if (!succeeded(reading, "media_filter_create", media_filter_create(filter.out()))
        || !succeeded(reading, "media_filter_set_order",
            media_filter_set_order(
                filter.get(), MEDIA_CONTENT_ORDER_ASC, "BOOKMARK_MARKED_TIME", MEDIA_CONTENT_COLLATE_DEFAULT)))
        return {};
    succeeded(reading, "media_info_foreach_bookmark_from_db",
        media_info_foreach_bookmark_from_db(mediaId.c_str(), filter.get(), collectCb, &reading));
    succeeded(reading, "media_filter_destroy", filter.close());
    return std::move(reading.bookmarks);
}

int mwInsertBookmarks(const std::string& mediaId, const std::vector<MwBookmark>& bookmarks)
{
    std::vector<media_bookmark_entry_s> entries;
    entries.reserve(bookmarks.size());
    for (const MwBookmark& bookmark : bookmarks)
        entries.push_back({bookmark.markedTime, bookmark.name.c_str()});
    return media_bookmark_insert_missing_to_db(mediaId.c_str(), entries.data(), static_cast<int>(entries.size()));
}
