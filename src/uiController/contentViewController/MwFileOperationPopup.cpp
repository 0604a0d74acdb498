#include "MwFileOperationPopup.h"

#include <utility>

#include <Elementary.h>

#include <libintl.h>
#include <panekit/WPopupController.h>

#include "MwLog.h"
#include "MwResourceMgr.h"
#include "MwText.h"

using panekit::WPopupController;

namespace {

constexpr auto LAYOUT_FILE = "edje/MwRecordingsContentView.edj";
constexpr auto DELETING_GROUP = "processing_popup";
constexpr auto MOVING_GROUP = "popup_text_progressbar_view_layout";
constexpr auto CLASH_GROUP = "popup_checkview_layout";
constexpr auto COMPLETE_SIGNAL = "progress,complete";
constexpr auto SEEN_SIGNAL = "animation,finished";
constexpr auto SIGNAL_SOURCE = "mewlo";
constexpr auto CLASH_TEXT = "IDS_MF_POP_THIS_FILE_NAME_HPS_IS_ALREADY_IN_USE_IN_THE_DESTINATION_FOLDER";

Evas_Object* createLayout(Evas_Object* parent, const char* group)
{
    std::string path;
    Evas_Object* layout = elm_layout_add(parent);
    if (!MwResourceMgr::getInstance()->getEdjPath(LAYOUT_FILE, path)
        || elm_layout_file_set(layout, path.c_str(), group) == EINA_FALSE)
        MW_LOGE("getEdjPath fail");
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_size_hint_align_set(layout, EVAS_HINT_FILL, EVAS_HINT_FILL);
    evas_object_show(layout);
    return layout;
}

void setTranslatable(Evas_Object* object, const char* part, const char* id)
{
    elm_object_domain_translatable_part_text_set(object, part, textdomain(nullptr), id);
}

// A name is shown as it is, whatever it looks like: nothing in it is markup, and what is no UTF-8 is left out.
std::string clashText(const std::string& fileName)
{
    std::string text = mwTranslate(CLASH_TEXT);
    if (const size_t place = text.find("%s"); place != std::string::npos)
        text.replace(place, 2, fileName);
    return mwAdopt(elm_entry_utf8_to_markup(text.c_str()));
}

}

MwFileOperationPopup::MwFileOperationPopup(Evas_Object* window)
    : _window(window)
{
}

MwFileOperationPopup::~MwFileOperationPopup() { close(); }

void MwFileOperationPopup::close()
{
    _movingLayout = _progressBar = _clashLayout = nullptr;
    if (auto* popup = std::exchange(_popup, nullptr); popup) {
        popup->setOnDestroyed(nullptr);
        popup->destroy();
    }
}

void MwFileOperationPopup::_show(WPopupController* popup, const char* name)
{
    _popup = popup;
    popup->setOnDestroyed([this] {
        _popup = nullptr;
        _movingLayout = _progressBar = _clashLayout = nullptr;
    });
    if (!popup->create(_window)) {
        MW_LOGE("the popup cannot be made");
        return;
    }
    evas_object_name_set(popup->getEvasObject(), name);
}

void MwFileOperationPopup::showDeleting(Callback onBack)
{
    close();
    auto* popup = new WPopupController();
    popup->setContent([this](Evas_Object* parent) { return _createDeletingContent(parent); });
    popup->setOnBack([onBack = std::move(onBack)](WPopupController*) { onBack(); });
    _show(popup, "deletePopup");
}

Evas_Object* MwFileOperationPopup::_createDeletingContent(Evas_Object* parent)
{
    Evas_Object* layout = createLayout(parent, DELETING_GROUP);
    Evas_Object* wheel = elm_progressbar_add(layout);
    elm_object_style_set(wheel, "process_medium");
    elm_progressbar_pulse_set(wheel, EINA_TRUE);
    elm_progressbar_pulse(wheel, EINA_TRUE);
    elm_object_part_content_set(layout, "processing", wheel);
    setTranslatable(layout, "elm.text", "IDS_COM_POP_DELETING");
    return layout;
}

void MwFileOperationPopup::showMoving(const MwFileOperator::Progress& progress, Callback onCancel)
{
    close();
    auto* popup = new WPopupController();
    popup->setTitle("IDS_MF_OPT_MOVE");
    popup->setContent([this](Evas_Object* parent) { return _createMovingContent(parent); });
    const auto cancel = [onCancel = std::move(onCancel)](WPopupController*) { onCancel(); };
    popup->addButton("IDS_MW_BUTTON_CANCEL", cancel);
    popup->setOnBack(cancel);
    _show(popup, "movePopup");
    update(progress);
}

Evas_Object* MwFileOperationPopup::_createMovingContent(Evas_Object* parent)
{
    _movingLayout = createLayout(parent, MOVING_GROUP);
    _progressBar = elm_progressbar_add(_movingLayout);
    elm_object_style_set(_progressBar, "mewlo/slim"); // the texts below say the number
    evas_object_size_hint_align_set(_progressBar, EVAS_HINT_FILL, 0.5);
    evas_object_size_hint_weight_set(_progressBar, EVAS_HINT_EXPAND, 0.0);
    elm_object_part_content_set(_movingLayout, "progressbar", _progressBar);
    setTranslatable(_movingLayout, "elm.text.description", "IDS_MF_POP_MOVING");
    elm_object_signal_callback_add(_movingLayout, SEEN_SIGNAL, SIGNAL_SOURCE, _barSeenCb, this);
    return _movingLayout;
}

void MwFileOperationPopup::update(const MwFileOperator::Progress& progress)
{
    if (!_progressBar)
        return;
    elm_progressbar_value_set(_progressBar, progress.share());
    elm_object_part_text_set(_movingLayout, "elm.text.left",
        mwFormat("%d/%d", static_cast<int>(progress.doneFiles), static_cast<int>(progress.allFiles)).c_str());
    elm_object_part_text_set(_movingLayout, "elm.text.right", mwFormat("%d%s", progress.percent(), "%").c_str());
}

void MwFileOperationPopup::complete(Callback onSeen)
{
    if (!_movingLayout)
        return onSeen();
    _onSeen = std::move(onSeen);
    elm_object_signal_emit(_movingLayout, COMPLETE_SIGNAL, SIGNAL_SOURCE);
}

void MwFileOperationPopup::_barSeenCb(void* data, Evas_Object*, const char*, const char*)
{
    // What follows usually deletes the popup and this object.
    if (const Callback seen = std::exchange(static_cast<MwFileOperationPopup*>(data)->_onSeen, nullptr); seen)
        seen();
}

void MwFileOperationPopup::showClash(const std::string& fileName, ClashCallbacks callbacks)
{
    close();
    _onApplyToAll = std::move(callbacks.onApplyToAll);
    auto* popup = new WPopupController();
    popup->setTitle("IDS_MF_HEADER_UNABLE_TO_PERFORM_ACTION_ABB2");
    popup->setContent([this, fileName](Evas_Object* parent) { return _createClashContent(parent, fileName); });
    const auto answering = [onAnswer = std::move(callbacks.onAnswer)](MwClashAction action) {
        return [onAnswer, action](WPopupController*) { onAnswer(action); };
    };
    popup->addButton("IDS_MW_BUTTON_CANCEL", answering(MwClashAction::CANCEL));
    popup->addButton("IDS_MF_BUTTON_REPLACE_ABB4", answering(MwClashAction::REPLACE));
    popup->addButton("IDS_MUSIC_OPT_RENAME", answering(MwClashAction::RENAME));
    popup->setOnBack(answering(MwClashAction::CANCEL));
    _show(popup, "duplicationPopup");
}

Evas_Object* MwFileOperationPopup::_createClashContent(Evas_Object* parent, const std::string& fileName)
{
    _clashLayout = createLayout(parent, CLASH_GROUP);
    Evas_Object* check = elm_check_add(_clashLayout);
    elm_object_style_set(check, "mewlo/popup");
    setTranslatable(check, nullptr, "IDS_MF_OPT_APPLY_TO_ALL_ITEMS_ABB");
    evas_object_smart_callback_add(check, "changed", _applyToAllChangedCb, this);
    elm_object_part_content_set(_clashLayout, "elm.swallow.content", check);
    setClashName(fileName);
    return _clashLayout;
}

void MwFileOperationPopup::setClashName(const std::string& fileName)
{
    if (_clashLayout)
        elm_object_part_text_set(_clashLayout, "elm.text", clashText(fileName).c_str());
}

void MwFileOperationPopup::_applyToAllChangedCb(void* data, Evas_Object* check, void*)
{
    const auto* self = static_cast<MwFileOperationPopup*>(data);
    if (self->_onApplyToAll)
        self->_onApplyToAll(elm_check_state_get(check) != EINA_FALSE);
}
