#include "MwTrimBookmarkWidget.h"

#include <Elementary.h>

#include <utility>

#include "MwLog.h"

namespace {

constexpr auto CLASS_NAME = "MwTrimBookmarkWidget";
constexpr int ICON_WIDTH = 14; // design units
constexpr int ICON_HEIGHT = 17;
constexpr int GAP = 2; // and the width of the line
constexpr int LINE_HEIGHT = 168;

int scaled(int units) { return static_cast<int>(units * elm_config_scale_get() / elm_app_base_scale_get()); }

void setPlace(Evas_Object* object, const Eina_Rectangle& place)
{
    evas_object_geometry_set(object, place.x, place.y, place.w, place.h);
}

}

struct MwTrimBookmarkWidget::Data {
    std::vector<MwSavedBookmark> bookmarks;
    std::vector<std::pair<Evas_Object*, Evas_Object*>> marks;
    unsigned int duration = 0; // milliseconds

    template <typename Action>
    void forEach(Action action)
    {
        for (const auto& [icon, line] : marks) {
            action(icon);
            action(line);
        }
    }
};

Evas_Smart* MwTrimBookmarkWidget::_smart()
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

MwTrimBookmarkWidget::Data* MwTrimBookmarkWidget::_dataOf(Evas_Object* widget)
{
    return static_cast<Data*>(evas_object_smart_data_get(widget));
}

Evas_Object* MwTrimBookmarkWidget::add(Evas* canvas, std::vector<MwSavedBookmark> bookmarks, unsigned int duration)
{
    Evas_Object* widget = evas_object_smart_add(canvas, _smart());
    _dataOf(widget)->bookmarks = std::move(bookmarks);
    _dataOf(widget)->duration = duration;
    return widget;
}

void MwTrimBookmarkWidget::addMark(Evas_Object* widget, Evas_Object* icon, Evas_Object* line)
{
    for (Evas_Object* part : {icon, line}) {
        evas_object_pass_events_set(part, EINA_TRUE);
        evas_object_smart_member_add(part, widget);
        if (Evas_Object* clip = evas_object_clip_get(widget); clip)
            evas_object_clip_set(part, clip);
    }
    _dataOf(widget)->marks.emplace_back(icon, line);
    evas_object_smart_changed(widget);
}

MwTrimBookmarkWidget::Mark MwTrimBookmarkWidget::place(
    const Eina_Rectangle& area, const Sizes& sizes, unsigned int second, unsigned int duration)
{
    const double ratio = duration > 0 ? second * 1000.0 / duration : 0.0;
    const int middle = area.x - sizes.iconWidth / 2;
    const int x = static_cast<int>(middle + area.w * ratio);
    const int y = area.y + (area.h + sizes.iconHeight) / 2 - sizes.iconHeight;
    return {{x, y, sizes.iconWidth, sizes.iconHeight},
        {x + sizes.iconWidth / 2, y + sizes.iconHeight + sizes.gap, sizes.gap, sizes.lineHeight}};
}

void MwTrimBookmarkWidget::_addCb(Evas_Object* widget) { evas_object_smart_data_set(widget, new Data); }

void MwTrimBookmarkWidget::_delCb(Evas_Object* widget)
{
    _dataOf(widget)->forEach(evas_object_del);
    delete _dataOf(widget);
    evas_object_smart_data_set(widget, nullptr);
}

void MwTrimBookmarkWidget::_moveCb(Evas_Object* widget, Evas_Coord, Evas_Coord) { evas_object_smart_changed(widget); }

void MwTrimBookmarkWidget::_resizeCb(Evas_Object* widget, Evas_Coord, Evas_Coord) { evas_object_smart_changed(widget); }

void MwTrimBookmarkWidget::_showCb(Evas_Object* widget) { _dataOf(widget)->forEach(evas_object_show); }

void MwTrimBookmarkWidget::_hideCb(Evas_Object* widget) { _dataOf(widget)->forEach(evas_object_hide); }

void MwTrimBookmarkWidget::_clipSetCb(Evas_Object* widget, Evas_Object* clip)
{
    _dataOf(widget)->forEach([clip](Evas_Object* part) { evas_object_clip_set(part, clip); });
}

void MwTrimBookmarkWidget::_clipUnsetCb(Evas_Object* widget) { _dataOf(widget)->forEach(evas_object_clip_unset); }

void MwTrimBookmarkWidget::_calculateCb(Evas_Object* widget)
{
    Data* data = _dataOf(widget);
    Eina_Rectangle area{};
    evas_object_geometry_get(widget, &area.x, &area.y, &area.w, &area.h);
    const Sizes sizes{scaled(ICON_WIDTH), scaled(ICON_HEIGHT), std::max(1, scaled(GAP)), scaled(LINE_HEIGHT)};
    for (size_t i = 0; i < data->marks.size(); ++i) {
        const Mark mark = place(area, sizes, data->bookmarks[i].markedTime, data->duration);
        setPlace(data->marks[i].first, mark.icon);
        setPlace(data->marks[i].second, mark.line);
    }
    if (evas_object_visible_get(widget))
        data->forEach(evas_object_show);
}
