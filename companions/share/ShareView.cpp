#include "ShareView.h"

#include <utility>

#include <Elementary.h>

#include <eext_event.h>
#include <panekit/WLanguage.h>
#include <uxt_theme.h>

namespace {

std::string describe(const std::vector<std::string>& paths)
{
    if (paths.size() == 1)
        return paths.front().substr(paths.front().rfind('/') + 1);
    std::string text = panekit::WLanguage::text("IDS_MW_BODY_PD_RECORDINGS");
    if (const size_t place = text.find("%d"); place != std::string::npos)
        text.replace(place, 2, std::to_string(paths.size()));
    return text;
}

}

ShareView::ShareView(Evas_Object* window, const std::string& layoutFile)
    : _layout(elm_layout_add(window))
{
    elm_layout_file_set(_layout, layoutFile.c_str(), "share_view");
    evas_object_size_hint_weight_set(_layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    elm_win_resize_object_add(window, _layout);
    evas_object_show(_layout);
    eext_object_event_callback_add(_layout, EEXT_CALLBACK_BACK, _backCb, this);
}

void ShareView::show(const std::vector<std::string>& paths, Choice choice, std::function<void()> closed)
{
    _ways = share::waysFor(paths);
    _choice = std::move(choice);
    _closed = std::move(closed);
    elm_object_part_text_set(_layout, "elm.text.title", panekit::WLanguage::text("IDS_MW_BODY_SHARE"));
    elm_object_part_text_set(_layout, "elm.text.subtitle", describe(paths).c_str());
    _box = elm_box_add(_layout);
    elm_box_align_set(_box, 0.5, 0.0);
    elm_object_part_content_set(_layout, "elm.swallow.content", _box); // deletes the one before
    _rows.clear();
    _rows.reserve(_ways.size());
    for (size_t way = 0; way < _ways.size(); ++way)
        _addRow(way);
    evas_object_show(_box);
}

void ShareView::_addRow(size_t way)
{
    _rows.push_back({this, way});
    Evas_Object* button = uxt_button_add_with_style(_box, "mewlo/menu_item");
    elm_object_text_set(button, panekit::WLanguage::text(_ways[way].textId));
    evas_object_size_hint_weight_set(button, EVAS_HINT_EXPAND, 0.0);
    evas_object_size_hint_align_set(button, EVAS_HINT_FILL, 0.0);
    evas_object_smart_callback_add(button, "clicked", _clickedCb, &_rows.back());
    elm_box_pack_end(_box, button);
    evas_object_show(button);
    if (way == 0)
        elm_object_focus_set(button, EINA_TRUE);
}

void ShareView::_clickedCb(void* data, Evas_Object*, void*)
{
    const auto* row = static_cast<Row*>(data);
    const share::Way way = row->view->_ways.at(row->way);
    if (const Choice choice = row->view->_choice; choice)
        choice(way);
}

void ShareView::_backCb(void* data, Evas_Object*, void*)
{
    if (const auto closed = static_cast<ShareView*>(data)->_closed; closed)
        closed();
}
