#include "MwBookmarkWidget.h"

#include <Elementary.h>

#include <cstring>
#include <utility>

#include "MwLog.h"

namespace {

constexpr auto CLASS_NAME = "MwBookmarkWidget";
constexpr int MARKER_SIZE = 50; // design units

template <typename Action>
void forEachMarker(Evas_Object* widget, Action action)
{
    Eina_List* markers = evas_object_smart_members_get(widget);
    void* marker = nullptr;
    EINA_LIST_FREE(markers, marker)
    action(static_cast<Evas_Object*>(marker));
}

}

struct MwBookmarkWidget::Data {
    std::vector<MwSavedBookmark> bookmarks;
    Eina_Rectangle area{0, 0, 0, 0};
    unsigned int duration = 0; // milliseconds
};

Evas_Smart* MwBookmarkWidget::_smart()
{
    static Evas_Smart_Class definition = EVAS_SMART_CLASS_INIT_NAME_VERSION(CLASS_NAME);
    static Evas_Smart* smart = nullptr;
    if (smart)
        return smart;
    definition.add = _addCb;
    definition.del = _delCb;
    definition.move = _moveCb;
    definition.resize = _resizeCb;
    definition.show = _showCb;
    definition.hide = _hideCb;
    definition.clip_set = _clipSetCb;
    definition.clip_unset = _clipUnsetCb;
    definition.calculate = _calculateCb;
    smart = evas_smart_class_new(&definition);
    return smart;
}

MwBookmarkWidget::Data* MwBookmarkWidget::_dataOf(Evas_Object* widget)
{
    const char* type = widget ? evas_object_type_get(widget) : nullptr;
    auto* data
        = type && std::strcmp(type, CLASS_NAME) == 0 ? static_cast<Data*>(evas_object_smart_data_get(widget)) : nullptr;
    if (!data)
        MW_LOGE("bookmarkData == nullptr!!!");
    return data;
}

Evas_Object* MwBookmarkWidget::add(Evas* canvas, std::vector<MwSavedBookmark> bookmarks, unsigned int duration)
{
    Evas_Object* widget = evas_object_smart_add(canvas, _smart());
    if (Data* data = _dataOf(widget); data) {
        data->bookmarks = std::move(bookmarks);
        data->duration = duration;
    }
    return widget;
}

void MwBookmarkWidget::addMarker(Evas_Object* widget, Evas_Object* image)
{
    evas_object_smart_member_add(image, widget);
    if (Evas_Object* clip = evas_object_clip_get(widget); clip)
        evas_object_clip_set(image, clip);
    evas_object_smart_changed(widget);
}

bool MwBookmarkWidget::shows(Evas_Object* widget, const std::vector<MwSavedBookmark>& bookmarks, unsigned int duration)
{
    const Data* data = _dataOf(widget);
    return data && data->duration == duration && data->bookmarks == bookmarks;
}

const std::vector<MwSavedBookmark>* MwBookmarkWidget::getBookmarks(Evas_Object* widget)
{
    const Data* data = _dataOf(widget);
    return data ? &data->bookmarks : nullptr;
}

MwBookmarkWidget::Point MwBookmarkWidget::place(
    const Eina_Rectangle& area, int size, unsigned int second, unsigned int duration)
{
    const double ratio = duration > 0 ? second * 1000.0 / duration : 0.0;
    const int first = area.x - size / 2;
    return {static_cast<int>(first + area.w * ratio), area.y + (area.h + size) / 2 - size};
}

void MwBookmarkWidget::_addCb(Evas_Object* widget) { evas_object_smart_data_set(widget, new Data); }

void MwBookmarkWidget::_delCb(Evas_Object* widget)
{
    forEachMarker(widget, evas_object_del);
    delete static_cast<Data*>(evas_object_smart_data_get(widget));
    evas_object_smart_data_set(widget, nullptr);
}

void MwBookmarkWidget::_moveCb(Evas_Object* widget, Evas_Coord x, Evas_Coord y)
{
    MW_LOGW("BEGIN - x : [%d], y : [%d]", x, y);
    if (Data* data = _dataOf(widget); data) {
        data->area.x = x;
        data->area.y = y;
        evas_object_smart_changed(widget);
    }
}

void MwBookmarkWidget::_resizeCb(Evas_Object* widget, Evas_Coord width, Evas_Coord height)
{
    MW_LOGW("BEGIN - w : [%d], h : [%d]", width, height);
    if (Data* data = _dataOf(widget); data) {
        data->area.w = width;
        data->area.h = height;
        evas_object_smart_changed(widget);
    }
}

void MwBookmarkWidget::_showCb(Evas_Object* widget) { forEachMarker(widget, evas_object_show); }

void MwBookmarkWidget::_hideCb(Evas_Object* widget) { forEachMarker(widget, evas_object_hide); }

// Markers are clipped with the widget; the canvas leaves that to the object.
void MwBookmarkWidget::_clipSetCb(Evas_Object* widget, Evas_Object* clip)
{
    forEachMarker(widget, [clip](Evas_Object* marker) { evas_object_clip_set(marker, clip); });
}

void MwBookmarkWidget::_clipUnsetCb(Evas_Object* widget) { forEachMarker(widget, evas_object_clip_unset); }

void MwBookmarkWidget::_calculateCb(Evas_Object* widget)
{
    const Data* data = _dataOf(widget);
    if (!data)
        return;
    const auto size = static_cast<int>(MARKER_SIZE * elm_config_scale_get() / elm_app_base_scale_get());
    const bool isShown = evas_object_visible_get(widget);
    size_t next = 0;
    forEachMarker(widget, [&](Evas_Object* marker) {
        if (next >= data->bookmarks.size())
            return;
        const Point at = place(data->area, size, data->bookmarks[next++].markedTime, data->duration);
        evas_object_resize(marker, size, size);
        evas_object_move(marker, at.x, at.y);
        if (isShown)
            evas_object_show(marker);
    });
    if (next == 0)
        MW_LOGE("imageList == nullptr!!!");
}
