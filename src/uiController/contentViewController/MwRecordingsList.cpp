// The recordings list: its contents, its redraw and what is docked below it.
#include "MwRecordingsContentViewController.h"

#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <panekit/WAccessibility.h>
#include <panekit/WPopupController.h>
#include <panekit/WTimer.h>
#include <uxt_theme.h>

#include "MwListDates.h"
#include "MwLog.h"
#include "MwPlayViewController.h"
#include "MwRecordingsModes.h"
#include "MwRecordingsRows.h"
#include "MwResourceMgr.h"
#include "MwText.h"
#include "MwTrimViewController.h"

using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecordingsContentView.edj";
constexpr auto RECORD_CONTROLLER_GROUP = "record_controller";
constexpr auto IMAGE_FILE = "edje/MwImages.edj";
constexpr auto LIST_PART = "elm.swallow.list";
constexpr auto CONTROLLER_PART = "elm.swallow.controller";
constexpr auto RECORD_PART = "record_button";
constexpr auto RADIO_KEY = "radio";
constexpr int NO_CHOICE_VALUE = -1;
constexpr double TAKING_DOWN_SECONDS = 0.004;

std::string edjePath(const char* file)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(file, path) || path.empty())
        MW_LOGE("getEdjPath fail");
    return path;
}

void setIcon(Evas_Object* button, const char* part, const char* image, const char* color)
{
    const std::string path = edjePath(IMAGE_FILE);
    if (path.empty())
        return;
    Evas_Object* icon = elm_image_add(button);
    elm_image_file_set(icon, path.c_str(), image);
    uxt_theme_object_set_color(icon, color);
    elm_object_part_content_set(button, part, icon);
    evas_object_show(icon);
}

Eina_Bool takeDownSlice(void* list)
{
    const double end = ecore_time_get() + TAKING_DOWN_SECONDS;
    while (Elm_Object_Item* row = elm_genlist_last_item_get(static_cast<Evas_Object*>(list))) {
        elm_object_item_del(row);
        if (ecore_time_get() > end)
            return ECORE_CALLBACK_RENEW;
    }
    evas_object_del(static_cast<Evas_Object*>(list)); // and with it this idler
    return ECORE_CALLBACK_RENEW;
}

// Thousands of rows at once would hold the main loop: they go in slices, out of sight. The list ends with its screen at
// the latest.
void takeDown(Evas_Object* list)
{
    evas_object_hide(list);
    Ecore_Idler* idler = ecore_idler_add(takeDownSlice, list);
    const auto gone = [](void* data, Evas*, Evas_Object*, void*) { ecore_idler_del(static_cast<Ecore_Idler*>(data)); };
    evas_object_event_callback_add(list, EVAS_CALLBACK_DEL, gone, idler);
}

// Gives one colour of a layout the value of another one.
void replaceColour(Evas_Object* layout, const char* replaced, const char* code)
{
    int red = 0;
    int green = 0;
    int blue = 0;
    int alpha = 0;
    uxt_theme_get_color(code, &red, &green, &blue, &alpha);
    edje_object_color_class_set(elm_layout_edje_get(layout), replaced, red, green, blue, alpha, red, green, blue, alpha,
        red, green, blue, alpha);
}

}

void MwRecordingsContentViewController::_update()
{
    if (!_isComplete())
        return;
    MW_LOGW("viewType : [%d], playerState : [%d]", _viewType, mwNumber(getModel()->getPlayerState()));
    const bool playsHere = mwRecordingsMode(_viewType).plays;
    if (std::exchange(_reloadNeeded, false))
        _loadContents();
    if (_genlist) {
        const MwRecordingsRows::Place place = _rows->getPlace();
        if (_rows->isRenewalCheaper(mwRecordingsMode(_viewType).files))
            _renewList();
        _rows->show(mwRecordingsMode(_viewType).files);
        if (playsHere && getModel()->getCurrentPlayPath().empty()) {
            _removeSelectAllItem();
            _clearChecks();
            if (_viewType == NORMAL)
                elm_radio_value_set(_radioGroup(), NO_CHOICE_VALUE);
        } else if (_getListType() == MwRecordingsListItem::MULTIPLE_CHOICE) {
            _loadSelectAllItem();
        }
        _rows->restore(place);
        _refreshRealizedItems();
    }
    _loadTitle(_checkedCount());
    _loadTitleButtons();
    _loadMoreButton();
    _updateController();
    if (_genlist)
        elm_object_disabled_set(_genlist, getModel()->isTrimMode());
}

// What is shown stays, when it is still the right one: rows then follow the catalogue one by one.
void MwRecordingsContentViewController::_loadContents()
{
    const bool isEmpty = getModel()->getRecordedFileList().empty();
    if (isEmpty ? _noContents != nullptr : _genlist != nullptr)
        return;
    _rows.reset();
    Evas_Object* content = elm_object_part_content_unset(getEvasObject(), LIST_PART);
    if (content && content == _genlist)
        takeDown(content);
    else if (content)
        evas_object_del(content);
    _genlist = nullptr;
    _noContents = nullptr;
    if (isEmpty)
        return _createNoContents();
    _createList();
    _loadListItems();
}

void MwRecordingsContentViewController::_createNoContents()
{
    _noContents = elm_layout_add(getEvasObject());
    elm_layout_theme_set(_noContents, "layout", "nocontents", "default");
    evas_object_size_hint_weight_set(_noContents, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_size_hint_align_set(_noContents, EVAS_HINT_FILL, EVAS_HINT_FILL);
    const char* domain = textdomain(nullptr);
    elm_object_domain_translatable_part_text_set(_noContents, "elm.text", domain, "IDS_MW_NPBODY_NO_RECORDINGS");
    elm_object_domain_translatable_part_text_set(
        _noContents, "elm.help.text", domain, "IDS_MW_BODY_AFTER_YOU_RECORD_VOICE_RECORDINGS_WILL_BE_SHOWN_HERE");
    elm_layout_signal_emit(_noContents, "text,disabled", "");
    elm_layout_signal_emit(_noContents, "align.center", "elm");
    _colourNoContents();
    elm_object_part_content_set(getEvasObject(), LIST_PART, _noContents);
    evas_object_show(_noContents);
}

void MwRecordingsContentViewController::_colourNoContents()
{
    if (!_noContents)
        return;
    replaceColour(_noContents, "T0222L1", "T0222L3");
    replaceColour(_noContents, "T0222L2", "T0222L4");
}

void MwRecordingsContentViewController::_createList()
{
    if (_genlist) {
        MW_LOGE("_genlist is already created");
        return;
    }
    _genlist = elm_genlist_add(getEvasObject());
    elm_genlist_homogeneous_set(_genlist, EINA_TRUE);
    elm_genlist_mode_set(_genlist, ELM_LIST_COMPRESS);
    elm_scroller_bounce_set(_genlist, EINA_FALSE, EINA_FALSE);
    elm_scroller_policy_set(_genlist, ELM_SCROLLER_POLICY_OFF, ELM_SCROLLER_POLICY_AUTO);
    mwRenewDates(_genlist);
    _listenToListKeys();
    elm_object_part_content_set(getEvasObject(), LIST_PART, _genlist);
    evas_object_show(_genlist);
    _focusList();
}

// The arrow keys mean the list, unless something lies over it.
void MwRecordingsContentViewController::_focusList()
{
    if (_genlist && isTop() && !hasAttachedPopup() && !panekit::WPopupController::topmost())
        elm_object_focus_set(_genlist, EINA_TRUE);
}

void MwRecordingsContentViewController::_loadListItems()
{
    _makeRows();
    _rows->show(mwRecordingsMode(_viewType).files);
    if (_viewType == PICK)
        _preselect();
}

// The rows come again in another list; the former one goes in slices.
void MwRecordingsContentViewController::_renewList()
{
    const int chosen = elm_radio_value_get(_radioGroup());
    const std::unique_ptr<MwRecordingsRows> former = std::move(_rows);
    takeDown(elm_object_part_content_unset(getEvasObject(), LIST_PART));
    _genlist = nullptr;
    _createList();
    _makeRows();
    _rows->succeed(*former);
    elm_radio_value_set(_radioGroup(), chosen);
}

void MwRecordingsContentViewController::_makeRows()
{
    // The group itself, hidden: the radios of the rows come and go with scrolling.
    Evas_Object* radioMain = elm_radio_add(_genlist);
    elm_radio_state_value_set(radioMain, NO_CHOICE_VALUE);
    elm_radio_value_set(radioMain, NO_CHOICE_VALUE);
    evas_object_data_set(_genlist, RADIO_KEY, radioMain);
    _rows = std::make_unique<MwRecordingsRows>(_genlist, _rowContext);
}

Evas_Object* MwRecordingsContentViewController::_radioGroup() const
{
    auto* group = _genlist ? static_cast<Evas_Object*>(evas_object_data_get(_genlist, RADIO_KEY)) : nullptr;
    if (!group)
        MW_LOGE("radioMain is nullptr");
    return group;
}

void MwRecordingsContentViewController::_loadSelectAllItem() { _rows->addSelectAll(); }

void MwRecordingsContentViewController::_removeSelectAllItem() { _rows->removeSelectAll(); }

void MwRecordingsContentViewController::_refreshRealizedItems()
{
    if (_rows)
        _rows->forEachRealized([](MwRecordingsListItem& row) { row.refresh(); });
}

// What is docked below the list: nothing while rows are selected, else the player of what is loaded or the record
// button.
void MwRecordingsContentViewController::_updateController()
{
    if (!mwRecordingsMode(_viewType).plays)
        return _destroyController();
    if (getModel()->isTrimMode())
        return _createTrimViewController();
    if (_trimView)
        _destroyController();
    if (!getModel()->getCurrentPlayPath().empty())
        return _createPlayViewController();
    if (_playView)
        _destroyController();
    _createRecordController();
}

void MwRecordingsContentViewController::_createRecordController()
{
    if (elm_object_part_content_get(getEvasObject(), CONTROLLER_PART))
        return;
    const std::string path = edjePath(LAYOUT_FILE);
    if (path.empty())
        return;
    Evas_Object* layout = elm_layout_add(getEvasObject());
    elm_layout_file_set(layout, path.c_str(), RECORD_CONTROLLER_GROUP);
    Evas_Object* button = uxt_button_add_with_style(layout, "mewlo/circle_button/large");
    setIcon(button, "elm.icon.normal", "mainView/voice_btn_rec.png", "AO014");
    setIcon(button, "elm.icon.bg", "mainView/voice_btn_bg_rec.png", "AO001");
    panekit::setAccessibleName(button, "IDS_MW_BODY_RECORD");
    elm_object_focus_move_policy_set(button, ELM_FOCUS_MOVE_POLICY_KEY_ONLY);
    const auto clicked = [](void* data, Evas_Object*, void*) {
        static_cast<MwRecordingsContentViewController*>(data)->_clickRecordButton();
    };
    evas_object_smart_callback_add(button, "clicked", clicked, this);
    elm_object_part_content_set(layout, RECORD_PART, button);
    elm_object_part_content_set(getEvasObject(), CONTROLLER_PART, layout);
    evas_object_show(layout);
}

void MwRecordingsContentViewController::_clickRecordButton()
{
    const auto alive = token();
    const auto finished = [this, alive](MwAppController::Command, MwAppController::Result result, void*) {
        if (result != MwAppController::SUCCESS)
            MW_LOGE("START_RECORDING failed");
        else if (!alive.expired() && isTop())
            popOut(); // to the screen of the recorder
    };
    if (!getAppController()->dispatchCommandAsync(MwAppController::START_RECORDING, finished, nullptr))
        MW_LOGE("START_RECORDING failed");
}

void MwRecordingsContentViewController::_destroyController()
{
    _playView = nullptr;
    _trimView = nullptr;
    if (Evas_Object* content = elm_object_part_content_unset(getEvasObject(), CONTROLLER_PART); content)
        evas_object_del(content);
    _announcePlayViewClosed();
}

void MwRecordingsContentViewController::_announcePlayViewClosed()
{
    if (!getModel()->isPlayViewShown())
        return;
    getModel()->setPlayViewShown(false);
    if (MwSignalMgr* signals = MwSignalMgr::existing(); signals)
        signals->getPlayViewClosedSignal().emit();
}

void MwRecordingsContentViewController::_createPlayViewController()
{
    if (_playView)
        return;
    _destroyController();
    _playView = new MwPlayViewController(getModel(), getAppController());
    _playView->getEventSignal().addListener([this](MwPlayViewController::eventType type) { _playViewEvent(type); });
    if (!_playView->dock(getEvasObject(), MwPlayViewController::REPORTS_FILE_CHANGES))
        return std::exchange(_playView, nullptr)->destroy();
    getModel()->setPlayViewShown(true);
}

void MwRecordingsContentViewController::_createTrimViewController()
{
    if (_trimView)
        return;
    _destroyController();
    _trimView = new MwTrimViewController(getModel(), getAppController());
    _trimView->getEventSignal().addListener([this](MwTrimViewController::eventType type) { _trimViewEvent(type); });
    if (!_trimView->dock(getEvasObject())) {
        getModel()->setTrimMode(false);
        std::exchange(_trimView, nullptr)->destroy();
    }
}

// Closed or saved, the player comes back. After the panel's own callback, for the redraw deletes the panel.
void MwRecordingsContentViewController::_trimViewEvent(int event)
{
    if (event != MwTrimViewController::TRIM_VIEW_EVENT_CLOSE && event != MwTrimViewController::TRIM_VIEW_EVENT_SAVED) {
        MW_LOGE("invalid eventType");
        return;
    }
    getModel()->setTrimMode(false);
    if (event == MwTrimViewController::TRIM_VIEW_EVENT_SAVED) {
        getModel()->createRecordedFileList();
        getModel()->setCurrentPlayPosition(0);
        _reloadNeeded = true;
    }
    const auto alive = token();
    WTimer::addJob([this, alive](void*) {
        if (alive.expired())
            return;
        _update();
        _focusList(); // what had the keyboard is gone
    });
}

void MwRecordingsContentViewController::_playViewEvent(int event)
{
    switch (event) {
    case MwPlayViewController::BOOKMARK_ADDED:
        _rows->forgetBookmarks();
        return;
    case MwPlayViewController::FILE_CHANGED:
        _refreshRealizedItems();
        return;
    case MwPlayViewController::TRIM_REQUESTED:
        _updateLater();
        return;
    default:
        MW_LOGE("invalid eventType");
    }
}

// After the panel's own callback, for the redraw may delete the panel.
void MwRecordingsContentViewController::_updateLater()
{
    const auto alive = token();
    WTimer::addJob([this, alive](void*) {
        if (!alive.expired())
            _update();
    });
}

void MwRecordingsContentViewController::_bringInItem()
{
    if (!mwRecordingsMode(_viewType).plays || !_rows)
        return;
    const std::string path = getModel()->getCurrentPlayPath();
    if (path.empty()) {
        MW_LOGW("current play path is empty!!!");
        return;
    }
    if (const MwRecordingsListItem* row = _rows->find(path); row)
        elm_genlist_item_bring_in(row->getItem(), ELM_GENLIST_ITEM_SCROLLTO_IN);
}

// Once the panel is there: it makes the list shorter.
void MwRecordingsContentViewController::_bringInAfterFrame()
{
    _cancelBringIn();
    evas_event_callback_add(
        evas_object_evas_get(getEvasObject()), EVAS_CALLBACK_RENDER_FLUSH_POST, _playerViewFulshPost, this);
}

void MwRecordingsContentViewController::_cancelBringIn()
{
    if (getEvasObject())
        evas_event_callback_del_full(
            evas_object_evas_get(getEvasObject()), EVAS_CALLBACK_RENDER_FLUSH_POST, _playerViewFulshPost, this);
}

void MwRecordingsContentViewController::_playerViewFulshPost(void* data, Evas*, void*)
{
    auto* self = static_cast<MwRecordingsContentViewController*>(data);
    if (!self) {
        MW_LOGE("data is nullptr");
        return;
    }
    self->_cancelBringIn();
    self->_bringInItem();
}
