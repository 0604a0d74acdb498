// The recordings list: its modes, its title and what a tap on a row does.
#include "MwRecordingsContentViewController.h"

#include <algorithm>
#include <libintl.h>

#include <Elementary.h>

#include <app.h>
#include <app_control.h>
#include <panekit/WAccessibility.h>
#include <uxt_theme.h>

#include "MwLog.h"
#include "MwNaviButtons.h"
#include "MwRecordingsModes.h"
#include "MwRecordingsRows.h"
#include "MwText.h"

namespace {

constexpr auto BACK_PART = "prev_btn";
constexpr auto LEFT_PART = "title_left_btn";
constexpr auto RIGHT_PART = "title_right_btn";
constexpr auto MORE_PART = "title_more_btn";
constexpr auto NORMAL_TITLE = "IDS_MW_HEADER_RECORDINGS_M_VOICE_ABB";

using Screen = MwRecordingsContentViewController;

}

MwRecordingsContentViewController::ListType MwRecordingsContentViewController::_getListType() const
{
    return mwRecordingsMode(_viewType).listType;
}

MwRecordingsContentViewController::ViewType MwRecordingsContentViewController::_restingViewType() const
{
    return getModel()->isRequestMode() ? PICK : NORMAL;
}

void MwRecordingsContentViewController::_loadTitle(size_t count)
{
    if (!getNaviItem())
        return;
    const char* titleId = mwRecordingsMode(_viewType).titleId;
    if (_viewType == PICK && _noContents)
        titleId = NORMAL_TITLE;
    if (!titleId && count == 0)
        titleId = "IDS_MW_HEADER_SELECT_RECORDINGS_ABB2";
    if (titleId)
        return setTitle(titleId);
    setCountTitle(count);
}

void MwRecordingsContentViewController::_loadTitleButtons()
{
    if (!getNaviItem())
        return;
    const auto back = [](void* data, Evas_Object*, void*) { static_cast<Screen*>(data)->_clickBackKey(); };
    const auto done = [](void* data, Evas_Object*, void*) { static_cast<Screen*>(data)->_titleRightButtonClicked(); };
    const MwRecordingsMode& mode = mwRecordingsMode(_viewType);
    const bool hasDone
        = mode.buttons == MwRecordingsMode::Buttons::CANCEL_AND_DONE && !(_viewType == PICK && _noContents);
    _setTitleButton(BACK_PART, hasDone ? nullptr : "naviframe/back_btn/default", nullptr, back);
    _setTitleButton(LEFT_PART, hasDone ? "naviframe/title_left" : nullptr, "IDS_TPLATFORM_ACBUTTON_CANCEL_ABB", back);
    _setTitleButton(RIGHT_PART, hasDone ? "naviframe/title_right" : nullptr, mode.doneTextId, done);
    _enableDoneButton();
}

// style: null takes the button away. One that is there already stays: it may be the one that is being clicked.
void MwRecordingsContentViewController::_setTitleButton(
    const char* part, const char* style, const char* textId, Evas_Smart_Cb clicked)
{
    if (!style)
        return mwRemoveNaviButton(getNaviItem(), part);
    Evas_Object* button = elm_object_item_part_content_get(getNaviItem(), part);
    if (button && textId)
        elm_object_domain_translatable_part_text_set(button, nullptr, textdomain(nullptr), textId);
    else if (!button && textId)
        mwSetTitleButton(getNaviItem(), part, style, textId, clicked, this);
    else if (!button)
        mwSetBackButton(getNaviItem(), clicked, this);
}

// The menu belongs to the list at rest.
void MwRecordingsContentViewController::_loadMoreButton()
{
    if (!getNaviItem())
        return;
    const bool hasMenu = _viewType == NORMAL && (_genlist || getModel()->hasHiddenRecordings());
    Evas_Object* button = elm_object_item_part_content_get(getNaviItem(), MORE_PART);
    if (hasMenu && !button)
        setMoreButton([this] { _clickMoreKey(); });
    else if (!hasMenu && button)
        evas_object_del(elm_object_item_part_content_unset(getNaviItem(), MORE_PART));
}

bool MwRecordingsContentViewController::_isDonePossible() const
{
    if (_getListType() == MwRecordingsListItem::MULTIPLE_CHOICE)
        return _checkedCount() > 0;
    return _genlist && elm_radio_value_get(_radioGroup()) > 0;
}

void MwRecordingsContentViewController::_enableDoneButton()
{
    if (Evas_Object* done = elm_object_item_part_content_get(getNaviItem(), RIGHT_PART); done)
        elm_object_disabled_set(done, !_isDonePossible());
}

size_t MwRecordingsContentViewController::_checkedCount() const
{
    if (!_rows || _getListType() != MwRecordingsListItem::MULTIPLE_CHOICE)
        return 0;
    return _rows->getCheckedPaths().size();
}

void MwRecordingsContentViewController::_clearChecks()
{
    _rows->forEachLoaded([](MwRecordingsListItem& row) {
        if (row.isChecked())
            row.setChecked(false);
        return true;
    });
}

// The recording that plays, else the one that was just made.
void MwRecordingsContentViewController::_preselect()
{
    std::string path = getModel()->getCurrentPlayPath();
    const std::string name = getModel()->getCurrentRecordingFileName();
    if (path.empty() && !name.empty()) {
        path = getModel()->getRecordingPath(name);
        getModel()->setCurrentRecordingFileName("");
    }
    if (path.empty())
        return;
    if (const MwRecordingsListItem* row = _rows->find(path); row)
        elm_radio_value_set(_radioGroup(), row->getIndex());
}

void MwRecordingsContentViewController::_onSelectListItem(MwRecordingsListItem& item)
{
    if (!_isComplete())
        return;
    switch (_getListType()) {
    case MwRecordingsListItem::NO_CHOICE:
        return _playListItem(item);
    case MwRecordingsListItem::MULTIPLE_CHOICE:
        return _toggle(item);
    case MwRecordingsListItem::SINGLE_CHOICE:
        break;
    }
    elm_radio_value_set(_radioGroup(), item.getIndex());
    if (_viewType == RENAME)
        return _openRenamePopup(item.getPath());
    _playListItem(item);
    _enableDoneButton();
}

void MwRecordingsContentViewController::_toggle(MwRecordingsListItem& item)
{
    item.setChecked(!item.isChecked());
    const bool checked = item.isChecked();
    MwRecordingsListItem* all = _rows->getSelectAll();
    bool areAllChecked = true;
    _rows->forEach([&](MwRecordingsListItem& row) {
        if (item.isSelectAll() && row.isChecked() != checked)
            row.setChecked(checked);
        areAllChecked = areAllChecked && row.isChecked();
        return true;
    });
    if (all && all->isChecked() != areAllChecked)
        all->setChecked(areAllChecked);
    _loadTitle(_checkedCount());
    _enableDoneButton();
}

void MwRecordingsContentViewController::_playListItem(MwRecordingsListItem& item)
{
    const std::string current = getModel()->getCurrentPlayPath();
    if (current.empty())
        return _startPlaying(item);
    if (current == item.getPath())
        return _toggleCurrent();
    _playOther(item);
}

void MwRecordingsContentViewController::_startPlaying(MwRecordingsListItem& item)
{
    getModel()->setCurrentPlayPath(item.getPath());
    if (!getAppController()->dispatchCommand(MwAppController::START_PLAYING)) {
        MW_LOGE("play start failed!");
        getModel()->setCurrentPlayPath("");
        return;
    }
    _bringInAfterFrame();
    item.refresh();
}

void MwRecordingsContentViewController::_toggleCurrent()
{
    MwAppController::Command command = MwAppController::START_PLAYING;
    const char* failure = "play start failed!";
    if (getModel()->getPlayerState() == PLAY_STATE_PLAYING) {
        command = MwAppController::PAUSE_PLAYING;
        failure = "play pause failed!";
    } else if (getModel()->getPlayerState() == PLAY_STATE_PAUSED) {
        command = MwAppController::RESUME_PLAYING;
        failure = "play resume failed!";
    }
    if (!getAppController()->dispatchCommand(command))
        MW_LOGE("%s", failure);
}

void MwRecordingsContentViewController::_playOther(MwRecordingsListItem& item)
{
    getModel()->setCurrentPlayPath(item.getPath());
    if (!getAppController()->dispatchCommand(MwAppController::RESTART_PLAYING))
        MW_LOGE("play other file start failed!");
    _refreshRealizedItems();
}

void MwRecordingsContentViewController::_titleRightButtonClicked()
{
    if (!_rows)
        return;
    switch (_viewType) {
    case PICK:
        return _replyWithSelected();
    case DELETE:
        return _clickDeleteButton(_rows->getCheckedPaths());
    case SHARE:
        _clickShareDoneButton(_rows->getCheckedPaths());
        return;
    case MOVE_TO_PRIVATE:
    case REMOVE_FROM_PRIVATE:
        return _clickMoveDoneButton(_rows->getCheckedPaths());
    case NORMAL:
    case RENAME:
        break;
    }
    MW_LOGE("View type error : [%d]!!!", _viewType);
}

void MwRecordingsContentViewController::_replyWithSelected()
{
    const MwRecordingsListItem* row = _rows->findByIndex(elm_radio_value_get(_radioGroup()));
    if (!row || !getModel()->fitsRequest(row->getPath())) {
        MW_LOGE("there is no such recording any more");
        return;
    }
    Request reply;
    if (const int result = app_control_create(reply.out()); result != 0) {
        MW_LOGE("app_control_create failed:[%d]", result);
        return;
    }
    MW_CALL(app_control_add_extra_data, reply.get(), APP_CONTROL_DATA_SELECTED, row->getPath().c_str());
    MW_CALL(
        app_control_reply_to_launch_request, reply.get(), getModel()->getRequestHandle(), APP_CONTROL_RESULT_SUCCEEDED);
    reply.close();
    getModel()->setRequestHandle(nullptr);
    ui_app_exit();
}
