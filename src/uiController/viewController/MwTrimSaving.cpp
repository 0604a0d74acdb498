#include "MwTrimSaving.h"

#include <Elementary.h>

#include <libintl.h>
#include <utility>

#include <panekit/WPopupController.h>

#include "MwAppController.h"
#include "MwLog.h"
#include "MwLoggingMgr.h"
#include "MwMemoryFullPopup.h"
#include "MwModel.h"
#include "MwResourceMgr.h"
#include "MwSavePopupMenuItem.h"
#include "MwStorageRoots.h"
#include "MwSystemMgr.h"
#include "MwText.h"

using panekit::WPopupController;
using panekit::WTimer;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecordingsContentView.edj";
constexpr auto PROCESSING_GROUP = "processing_popup";
constexpr auto PROCESSING_PART = "processing";
constexpr auto TEXT_PART = "elm.text";
constexpr auto SAVING_TEXT = "IDS_MW_POP_SAVING_ING";
constexpr double START_DELAY = 0.3; // seconds
constexpr double PROGRESS_INTERVAL = 0.1;
constexpr double BYTES_PER_SECOND = 88200; // more than any recording needs
constexpr int NONE_MARKED = -1;
constexpr int AS_NEW_FILE = 0;
constexpr int OVER_ORIGINAL = 1;

}

MwTrimSaving::MwTrimSaving(Evas_Object* panel, MwModel* model, MwAppController* appController, Done done)
    : _panel(panel)
    , _model(model)
    , _appController(appController)
    , _done(std::move(done))
{
}

MwTrimSaving::~MwTrimSaving()
{
    WTimer::destroy(_startTimer);
    _closePopups();
    if (_trim)
        _trim->cancel();
}

void MwTrimSaving::ask(Request request)
{
    if (_savePopup) {
        MW_LOGW("save popup is already created ");
        return;
    }
    if (_loadingPopup)
        return;
    _request = std::move(request);
    _createSavePopup();
}

void MwTrimSaving::_createSavePopup()
{
    _marked = NONE_MARKED;
    _savePopup = new WPopupController();
    _savePopup->setTitle("IDS_MW_HEADER_SAVE_TRIMMED_RECORDING_ABB_M_VOICE");
    _savePopup->setStyle("theme_bg");
    _savePopup->setContent([this](Evas_Object* popup) {
        Evas_Object* list = elm_genlist_add(popup);
        elm_genlist_homogeneous_set(list, EINA_TRUE);
        elm_genlist_mode_set(list, ELM_LIST_COMPRESS);
        elm_scroller_content_min_limit(list, EINA_FALSE, EINA_TRUE);
        evas_object_size_hint_weight_set(list, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
        evas_object_size_hint_align_set(list, EVAS_HINT_FILL, EVAS_HINT_FILL);
        for (const int index : {0, 1})
            (new MwSavePopupMenuItem(index, [this](int chosen) { _choose(chosen); }))->append(list);
        // What has the keyboard when the list is focused is its inner object.
        evas_object_event_callback_priority_add(
            elm_layout_edje_get(list), EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, _listKeyCb, this);
        evas_object_show(list);
        _choices = list;
        return list;
    });
    _savePopup->setOnDestroyed([this] { _savePopup = nullptr; });
    _savePopup->create(elm_object_top_widget_get(_panel));
    // The arrow keys go to the choices at once.
    elm_object_focus_set(_choices, EINA_TRUE);
}

void MwTrimSaving::_listKeyCb(void* data, Evas*, Evas_Object*, void* info)
{
    auto* event = static_cast<Evas_Event_Key_Down*>(info);
    if (static_cast<MwTrimSaving*>(data)->_takeListKey(event->key))
        event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
}

bool MwTrimSaving::_takeListKey(const std::string& key)
{
    if (key == "Up" || key == "KP_Up")
        _mark(AS_NEW_FILE);
    else if (key == "Down" || key == "KP_Down")
        _mark(_marked == NONE_MARKED ? AS_NEW_FILE : OVER_ORIGINAL);
    else if ((key == "Return" || key == "KP_Enter" || key == "space") && _marked != NONE_MARKED)
        _choose(_marked);
    else
        return false;
    return true;
}

void MwTrimSaving::_mark(int index)
{
    _marked = index;
    Elm_Object_Item* item = elm_genlist_first_item_get(_choices);
    for (int i = 0; item; ++i, item = elm_genlist_item_next_get(item))
        elm_object_item_signal_emit(item, i == index ? "highlight,on" : "highlight,off", "mewlo");
}

void MwTrimSaving::_choose(int index)
{
    if (_savePopup)
        _savePopup->destroy();
    const bool asNewFile = index == AS_NEW_FILE;
    MwLoggingMgr::getInstance()->insert("trim", asNewFile ? "anf" : "oof");
    _startTrim(asNewFile);
}

bool MwTrimSaving::_hasRoom(int storage) const
{
    const double needed = (_request.end - _request.begin) * BYTES_PER_SECOND / 1000;
    double room = 0;
    return !MwSystemMgr::getInstance()->getAvailStorageSize(storage, &room) || room >= needed;
}

void MwTrimSaving::_startTrim(bool asNewFile)
{
    if (_model->getPlayerState() != PLAY_STATE_NONE
        && !_appController->dispatchCommand(MwAppController::STOP_PLAYING)) {
        MW_LOGE("stop failed!");
        return;
    }
    if (_request.path.empty()) {
        MW_LOGE("_playPath is NULL");
        return;
    }
    const bool isOnCard = _request.path.starts_with(mwCardRoot() + "/");
    const int storage = isOnCard ? MW_STORAGE_CARD : MW_STORAGE_DEVICE;
    if (!_hasRoom(storage)) {
        mwCreateMemoryFullPopup(elm_object_top_widget_get(_panel), storage);
        return;
    }
    _createLoadingPopupController(SAVING_TEXT);
    WTimer::destroy(_startTimer);
    _startTimer = WTimer::addTimer(START_DELAY, [this, asNewFile](void*) {
        _runTrim(asNewFile);
        return false;
    });
}

void MwTrimSaving::_createLoadingPopupController(const char* text)
{
    if (!text || *text == '\0') {
        MW_LOGE("text is empty");
        return;
    }
    _loadingPopup = new WPopupController();
    _loadingPopup->setContent([this, text](Evas_Object* popup) {
        std::string path;
        Evas_Object* layout = elm_layout_add(popup);
        if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path)
            || elm_layout_file_set(layout, path.c_str(), PROCESSING_GROUP) == EINA_FALSE)
            MW_LOGE("getEdjPath fail");
        evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
        evas_object_size_hint_align_set(layout, EVAS_HINT_FILL, EVAS_HINT_FILL);
        Evas_Object* wheel = elm_progressbar_add(layout);
        elm_object_style_set(wheel, "process_medium");
        elm_progressbar_pulse_set(wheel, EINA_TRUE);
        elm_progressbar_pulse(wheel, EINA_TRUE);
        elm_object_part_content_set(layout, PROCESSING_PART, wheel);
        elm_object_domain_translatable_part_text_set(layout, TEXT_PART, textdomain(nullptr), text);
        evas_object_show(layout);
        _loadingLayout = layout;
        return layout;
    });
    _loadingPopup->setOnBack([this](WPopupController*) { _backPressed(); });
    _loadingPopup->setOnDestroyed([this] {
        _loadingPopup = nullptr;
        _loadingLayout = nullptr;
    });
    _loadingPopup->create(elm_object_top_widget_get(_panel));
}

// Before the trim has started there is nothing to wait for.
void MwTrimSaving::_backPressed()
{
    if (_trim) {
        _trim->cancel();
        return;
    }
    WTimer::destroy(_startTimer);
    _closePopups();
    const Done done = _done; // goes with the panel
    done(false);
}

void MwTrimSaving::_runTrim(bool asNewFile)
{
    _trim = std::make_unique<MwTrim>();
    _trim->trimSignal.addListener([this](MwTrim::eventType type) { _ended(type); }, _panel);
    _progressTimer = WTimer::addTimer(PROGRESS_INTERVAL, [this](void*) {
        _showProgress();
        return true;
    });
    _trim->start(_request.path.c_str(), !asNewFile, static_cast<int>(_request.begin), static_cast<int>(_request.end),
        static_cast<int>(_request.duration));
}

void MwTrimSaving::_showProgress()
{
    if (_loadingLayout)
        elm_object_part_text_set(_loadingLayout, TEXT_PART,
            mwFormat("%s %d %%", mwTranslate(SAVING_TEXT).c_str(), MwTrim::getProgress()).c_str());
}

const char* MwTrimSaving::_messageOf(MwTrim::Failure failure)
{
    switch (failure) {
    case MwTrim::Failure::NOT_SUPPORTED:
    case MwTrim::Failure::DAMAGED:
        return "IDS_MW_TPOP_THIS_RECORDING_CANNOT_BE_TRIMMED";
    case MwTrim::Failure::OUT_OF_STORAGE:
        return "IDS_IDLE_POP_YOUR_DEVICE_STORAGE_DOESNT_HAVE_ENOUGH_SPACE_MSG";
    case MwTrim::Failure::CHANGED:
        return "IDS_MW_TPOP_NOT_TRIMMED_RECORDING_CHANGED";
    case MwTrim::Failure::OTHER:
        return "IDS_MW_TPOP_TRIMMING_FAILED";
    case MwTrim::Failure::NONE:
    case MwTrim::Failure::CANCELLED:
        break;
    }
    return nullptr;
}

void MwTrimSaving::_ended(MwTrim::eventType type)
{
    MW_LOGI("type : [%d]", type);
    _closePopups();
    const char* message = type == MwTrim::TRIM_EVENT_FAILED ? _messageOf(_trim->getFailure()) : nullptr;
    if (message)
        mwPost(message);
    const Done done = _done;
    done(type == MwTrim::TRIM_EVENT_DONE);
}

void MwTrimSaving::_closePopups()
{
    WTimer::destroy(_progressTimer);
    for (WPopupController** popup : {&_savePopup, &_loadingPopup}) {
        if (auto* open = std::exchange(*popup, nullptr); open) {
            open->setOnDestroyed(nullptr);
            open->destroy();
        }
    }
    _loadingLayout = nullptr;
}
