// The player panel: the bookmarks of the recording.
#include "MwPlayViewController.h"

#include <Elementary.h>

#include <media_content.h>
#include <notification.h>
#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include <algorithm>
#include <utility>

#include "MwBookmarkWidget.h"
#include "MwLoggingMgr.h"
#include "MwModel.h"
#include "MwPlayRules.h"
#include "MwResourceMgr.h"
#include "MwSavedBookmarks.h"
#include "MwText.h"

namespace {

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

Evas_Object* MwPlayViewController::_bookmarkWidget() const
{
    return elm_object_part_content_get(getEvasObject(), _bookmarkPart.c_str());
}

void MwPlayViewController::_removeBookmarkWidget()
{
    if (Evas_Object* widget = elm_object_part_content_unset(getEvasObject(), _bookmarkPart.c_str()); widget)
        evas_object_del(widget);
}

void MwPlayViewController::_clickBookmarkButton()
{
    if (!_model) {
        MW_LOGE("_model == nullptr");
        return;
    }
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
    _eventSignal.emit(BOOKMARK_ADDED);
}

void MwPlayViewController::_loadBookmark()
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
    Evas_Object* widget = MwBookmarkWidget::add(evas_object_evas_get(getEvasObject()), std::move(bookmarks), _duration);
    elm_object_part_content_set(getEvasObject(), _bookmarkPart.c_str(), widget);
    _addMarkers(widget);
    evas_object_show(widget);
}

void MwPlayViewController::_addMarkers(Evas_Object* widget)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return;
    }
    for (const MwSavedBookmark& bookmark : *MwBookmarkWidget::getBookmarks(widget)) {
        Evas_Object* marker = elm_image_add(getEvasObject());
        elm_image_file_set(marker, path.c_str(), MARKER_IMAGE);
        uxt_theme_object_set_color(marker, MARKER_COLOR);
        evas_object_size_hint_align_set(marker, EVAS_HINT_FILL, EVAS_HINT_FILL);
        evas_object_size_hint_weight_set(marker, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
        if (!bookmark.name.empty())
            panekit::setAccessibleName(marker, bookmark.name);
        MwBookmarkWidget::addMarker(widget, marker);
    }
}
