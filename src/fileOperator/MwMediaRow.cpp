#include "MwMediaRow.h"

#include <media_content.h>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwText.h"

namespace {

using Filter = MwHandle<filter_h, media_filter_destroy>;

struct Moving {
    const char* destination;
    MwMediaRow::Move outcome = MwMediaRow::Move::UNKNOWN;
};

bool moveCb(media_info_h media, void* userData)
{
    auto* moving = static_cast<Moving*>(userData);
    const int result = media_info_move_to_db(media, moving->destination);
    if (result != 0)
        MW_LOGE("media_info_move_media_to_db()... [0x%x]", static_cast<unsigned>(result));
    moving->outcome = result == 0 ? MwMediaRow::Move::DONE : MwMediaRow::Move::FAILED;
    return false;
}

bool takeIdCb(media_info_h media, void* userData)
{
    char* id = nullptr;
    if (MW_CALL(media_info_get_media_id, media, &id))
        *static_cast<std::string*>(userData) = mwAdopt(id);
    return false;
}

bool select(Filter& filter, const std::string& path)
{
    if (const int result = media_filter_create(filter.out()); result != 0) {
        MW_LOGE("media_filter_create() failed! [%d]", result);
        return false;
    }
    // Exactly this path: the column itself does not tell capital letters from small ones.
    const std::string condition = "MEDIA_PATH=\"" + mwAdopt(media_content_escape(path.c_str())) + "\" COLLATE BINARY";
    if (const int r = media_filter_set_condition(filter.get(), condition.c_str(), MEDIA_CONTENT_COLLATE_DEFAULT);
        r != 0) {
        MW_LOGE("media_filter_set_condition failed : [%d]!!!", r);
        return false;
    }
    if (const int result = media_filter_set_offset(filter.get(), 0, 1); result != 0) {
        MW_LOGE("media_filter_set_offset failed : [%d]!!!", result);
        return false;
    }
    return true;
}

}

namespace MwMediaRow {

Move move(const std::string& from, const std::string& to)
{
    Filter filter;
    if (!select(filter, from))
        return Move::FAILED;
    Moving moving{to.c_str()};
    if (const int result = media_info_foreach_media_from_db(filter.get(), moveCb, &moving); result != 0) {
        MW_LOGE("media_info_foreach_media_from_db failed : [%d]!!!", result);
        return Move::FAILED;
    }
    return moving.outcome;
}

std::string idAt(const std::string& path)
{
    Filter filter;
    std::string id;
    if (select(filter, path))
        MW_CALL(media_info_foreach_media_from_db, filter.get(), takeIdCb, &id);
    return id;
}

bool remove(const std::vector<std::string>& mediaIds)
{
    std::vector<const char*> ids;
    ids.reserve(mediaIds.size());
    for (const std::string& id : mediaIds)
        ids.push_back(id.c_str());
    const int result = media_info_delete_list_from_db(ids.data(), static_cast<int>(ids.size()));
    if (result != 0)
        MW_LOGE("media_info_delete_from_db : [%d]!!!", result);
    return result == 0;
}

}
