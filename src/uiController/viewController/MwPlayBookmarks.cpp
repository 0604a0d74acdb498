#include "MwPlayBookmarks.h"

#include <Elementary.h>

#include <media_content.h>
#include <notification.h>
#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include <algorithm>
#include <utility>

#include "MwBookmarkWidget.h"
#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwModel.h"
#include "MwPlayButton.h"
#include "MwPlayRules.h"
#include "MwResourceMgr.h"
#include "MwSavedBookmarks.h"
#include "MwText.h"

namespace {

constexpr auto WIDGET_PART = "bookmark_confine_rect";
constexpr auto BUTTON_PART = "bookmark_btn";
constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr auto MARKER_IMAGE = "mainView/voice_icon_bookmark_02.png";
constexpr auto MARKER_COLOR = "AO002";

void readingFailed(const char* call, int code) { MW_LOGE("%s failed : [%d]!!!", call, code); }

std::vector<std::string> namesOf(const std::vector<MwSavedBookmark>& bookmarks)
{
    std::vector<std::string> names;
    names.reserve(bookmarks.size());
    for (const MwSavedBookmark& bookmark : bookmarks)
        names.push_back(bookmark.name);
    return names;
}

}

MwPlayBookmarks::MwPlayBookmarks(Evas_Object* layout, MwModel* model, std::function<void()> added)
    : _layout(layout)
    , _model(model)
    , _added(std::move(added))
{
}

void MwPlayBookmarks::load()
{
    _loadBookmarkButton();
    _loadBookmark();
}

void MwPlayBookmarks::hide()
{
    if (Evas_Object* widget = _bookmarkWidget(); widget)
        evas_object_hide(widget);
}

void MwPlayBookmarks::_loadBookmarkButton()
{
    if (_model->isRequestMode() || elm_object_part_content_get(_layout, BUTTON_PART))
        return;
    Evas_Object* button = MwPlayButton::create(_layout,
        {BUTTON_PART, false, "mainView/voice_icon_bookmark.png", "IDS_MW_BODY_BOOKMARK", "IDS_MW_BODY_BOOKMARK"});
    if (!button)
        return;
    const auto clicked
        = [](void* data, Evas_Object*, void*) { static_cast<MwPlayBookmarks*>(data)->_clickBookmarkButton(); };
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    MwPlayButton::tintWhilePressed(button);
}

Evas_Object* MwPlayBookmarks::_bookmarkWidget() const { return elm_object_part_content_get(_layout, WIDGET_PART); }

void MwPlayBookmarks::_removeBookmarkWidget()
{
    if (Evas_Object* widget = elm_object_part_content_unset(_layout, WIDGET_PART); widget)
        evas_object_del(widget);
}

void MwPlayBookmarks::_clickBookmarkButton()
{
    const unsigned int second = mwBookmarkSecond(_model->getCurrentPlayPosition(), _duration);
    static const std::vector<MwSavedBookmark> NONE;
    Evas_Object* widget = _bookmarkWidget();
    const auto* shown = widget ? MwBookmarkWidget::getBookmarks(widget) : &NONE;
    if (!shown)
        return;
    if (shown->size() >= MwModel::MAX_BOOKMARKS) {
        notification_status_message_post(
            mwTranslateNumber("IDS_MW_TPOP_CANT_ADD_MORE_THAN_PD_BOOKMARKS", MwModel::MAX_BOOKMARKS).c_str());
        return;
    }
    if (std::any_of(shown->begin(), shown->end(), [&](const auto& each) { return each.markedTime == second; }))
        return mwPost("IDS_MW_TPOP_ALREADY_ADDED_TO_BOOKMARKS");
    const MwFileInfo* info = _model->getRecordedFileInfoByPath(_model->getCurrentPlayPath());
    if (!info) {
        MW_LOGE("getRecordedFileInfoByPath is NULL!!!");
        return;
    }
    const std::string name = mwFreeBookmarkName(mwTranslate("IDS_MW_BODY_BOOKMARK"), namesOf(*shown));
    if (!MW_CALL(media_bookmark_insert_to_db, info->mediaId.c_str(), second, name.c_str()))
        return;
    MwLoggingMgr::getInstance()->insert("BMRK");
    _loadBookmark();
    _added();
}

void MwPlayBookmarks::_loadBookmark()
{
    const MwFileInfo* info = _model->getRecordedFileInfoByPath(_model->getCurrentPlayPath());
    if (!info) {
        MW_LOGE("getRecordedFileInfoByPath is NULL!!!");
        return _removeBookmarkWidget();
    }
    std::vector<MwSavedBookmark> bookmarks = mwReadBookmarks(info->mediaId, readingFailed);
    if (Evas_Object* widget = _bookmarkWidget(); widget && MwBookmarkWidget::shows(widget, bookmarks, _duration))
        return evas_object_show(widget);
    _removeBookmarkWidget();
    if (bookmarks.empty())
        return;
    Evas_Object* widget = MwBookmarkWidget::add(evas_object_evas_get(_layout), std::move(bookmarks), _duration);
    elm_object_part_content_set(_layout, WIDGET_PART, widget);
    _addMarkers(widget);
    evas_object_show(widget);
}

void MwPlayBookmarks::_addMarkers(Evas_Object* widget)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return;
    }
    for (const MwSavedBookmark& bookmark : *MwBookmarkWidget::getBookmarks(widget)) {
        Evas_Object* marker = elm_image_add(_layout);
        elm_image_file_set(marker, path.c_str(), MARKER_IMAGE);
        uxt_theme_object_set_color(marker, MARKER_COLOR);
        evas_object_size_hint_align_set(marker, EVAS_HINT_FILL, EVAS_HINT_FILL);
        evas_object_size_hint_weight_set(marker, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
        if (!bookmark.name.empty())
            panekit::setAccessibleName(marker, bookmark.name);
        MwBookmarkWidget::addMarker(widget, marker);
    }
}
