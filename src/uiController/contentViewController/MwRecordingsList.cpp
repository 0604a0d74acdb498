#include "MwRecordingsList.h"

#include <algorithm>
#include <array>
#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include <uxt_theme.h>

#include "MwListDates.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwRecordingsMode.h"

namespace {

constexpr auto LIST_PART = "elm.swallow.list";
constexpr auto RADIO_KEY = "radio";
constexpr int NO_CHOICE_VALUE = -1;
constexpr double TAKING_DOWN_SECONDS = 0.004;
constexpr int ALL_ROWS = 1 << 30;

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

// How far a key moves the highlight, 0 for other keys.
int rowsOfKey(const std::string& key, int page)
{
    struct Move {
        const char* key;
        int rows;
    };
    const std::array<Move, 6> moves = {{
        {.key = "Down", .rows = 1},
        {.key = "Up", .rows = -1},
        {.key = "Next", .rows = page},
        {.key = "Prior", .rows = -page},
        {.key = "End", .rows = ALL_ROWS},
        {.key = "Home", .rows = -ALL_ROWS},
    }};
    const auto found = std::find_if(moves.begin(), moves.end(), [&](const Move& move) { return key == move.key; });
    return found != moves.end() ? found->rows : 0;
}

}

MwRecordingsList::MwRecordingsList(Evas_Object* layout, MwModel* model, const MwRecordingsMode& mode, Screen screen)
    : _layout(layout)
    , _model(model)
    , _mode(&mode)
    , _screen(std::move(screen))
{
    _rowContext.model = model;
    _rowContext.getListType = [this] { return _mode->listType; };
    _rowContext.onSelected = [this](Item& row) { _screen.onSelected(row); };
}

MwRecordingsList::~MwRecordingsList() = default;

void MwRecordingsList::close()
{
    _cancelBringIn();
    _rows.reset();
}

void MwRecordingsList::setDisabled(bool disabled)
{
    if (_genlist)
        elm_object_disabled_set(_genlist, disabled);
}

void MwRecordingsList::load()
{
    const bool isEmpty = _model->getRecordedFileList().empty();
    if (isEmpty ? _noContents != nullptr : _genlist != nullptr)
        return;
    _takeDownContents();
    if (isEmpty)
        return _createNoContents();
    _createList();
    _makeRows();
    _rows->show(_mode->files);
    if (_mode->picks)
        _preselect();
}

void MwRecordingsList::_takeDownContents()
{
    _rows.reset();
    Evas_Object* content = elm_object_part_content_unset(_layout, LIST_PART);
    if (content && content == _genlist)
        takeDown(content);
    else if (content)
        evas_object_del(content);
    _genlist = nullptr;
    _noContents = nullptr;
}

void MwRecordingsList::update()
{
    if (!_rows)
        return;
    const MwRecordingsRows::Place place = _rows->getPlace();
    if (_rows->isRenewalCheaper(_mode->files))
        _renewList();
    _rows->show(_mode->files);
    _updateChoice();
    _rows->restore(place);
    refreshRealizedItems();
}

void MwRecordingsList::_updateChoice()
{
    if (_mode->plays && _model->getCurrentPlayPath().empty()) {
        _rows->removeSelectAll();
        _clearChecks();
        if (!_mode->picks)
            elm_radio_value_set(_radioGroup(), NO_CHOICE_VALUE);
    } else if (_mode->listType == Item::MULTIPLE_CHOICE) {
        _rows->addSelectAll();
    }
}

void MwRecordingsList::_createNoContents()
{
    _noContents = elm_layout_add(_layout);
    elm_layout_theme_set(_noContents, "layout", "nocontents", "default");
    evas_object_size_hint_weight_set(_noContents, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_size_hint_align_set(_noContents, EVAS_HINT_FILL, EVAS_HINT_FILL);
    const char* domain = textdomain(nullptr);
    elm_object_domain_translatable_part_text_set(_noContents, "elm.text", domain, "IDS_MW_NPBODY_NO_RECORDINGS");
    elm_object_domain_translatable_part_text_set(
        _noContents, "elm.help.text", domain, "IDS_MW_BODY_AFTER_YOU_RECORD_VOICE_RECORDINGS_WILL_BE_SHOWN_HERE");
    elm_layout_signal_emit(_noContents, "text,disabled", "");
    elm_layout_signal_emit(_noContents, "align.center", "elm");
    colourNoContents();
    elm_object_part_content_set(_layout, LIST_PART, _noContents);
    evas_object_show(_noContents);
}

void MwRecordingsList::colourNoContents()
{
    if (!_noContents)
        return;
    replaceColour(_noContents, "T0222L1", "T0222L3");
    replaceColour(_noContents, "T0222L2", "T0222L4");
}

void MwRecordingsList::_createList()
{
    _genlist = elm_genlist_add(_layout);
    elm_genlist_homogeneous_set(_genlist, EINA_TRUE);
    elm_genlist_mode_set(_genlist, ELM_LIST_COMPRESS);
    elm_scroller_bounce_set(_genlist, EINA_FALSE, EINA_FALSE);
    elm_scroller_policy_set(_genlist, ELM_SCROLLER_POLICY_OFF, ELM_SCROLLER_POLICY_AUTO);
    mwRenewDates(_genlist);
    _listenToListKeys();
    elm_object_part_content_set(_layout, LIST_PART, _genlist);
    evas_object_show(_genlist);
    _screen.onListCreated();
}

void MwRecordingsList::renewDates()
{
    if (_genlist)
        mwRenewDates(_genlist);
    refreshRealizedItems();
}

void MwRecordingsList::focus()
{
    if (_genlist)
        elm_object_focus_set(_genlist, EINA_TRUE);
}

// The rows come again in another list; the former one goes in slices.
void MwRecordingsList::_renewList()
{
    const int chosen = elm_radio_value_get(_radioGroup());
    const std::unique_ptr<MwRecordingsRows> former = std::move(_rows);
    takeDown(elm_object_part_content_unset(_layout, LIST_PART));
    _genlist = nullptr;
    _createList();
    _makeRows();
    _rows->succeed(*former);
    elm_radio_value_set(_radioGroup(), chosen);
}

void MwRecordingsList::_makeRows()
{
    // The group itself, hidden: the radios of the rows come and go with scrolling.
    Evas_Object* radioMain = elm_radio_add(_genlist);
    elm_radio_state_value_set(radioMain, NO_CHOICE_VALUE);
    elm_radio_value_set(radioMain, NO_CHOICE_VALUE);
    evas_object_data_set(_genlist, RADIO_KEY, radioMain);
    _rows = std::make_unique<MwRecordingsRows>(_genlist, _rowContext);
}

Evas_Object* MwRecordingsList::_radioGroup() const
{
    auto* group = _genlist ? static_cast<Evas_Object*>(evas_object_data_get(_genlist, RADIO_KEY)) : nullptr;
    if (!group)
        MW_LOGE("radioMain is nullptr");
    return group;
}

void MwRecordingsList::refreshRealizedItems()
{
    if (_rows)
        _rows->forEachRealized([](Item& row) { row.refresh(); });
}

void MwRecordingsList::forgetBookmarks()
{
    if (_rows)
        _rows->forgetBookmarks();
}

void MwRecordingsList::_clearChecks()
{
    _rows->forEachLoaded([](Item& row) {
        if (row.isChecked())
            row.setChecked(false);
        return true;
    });
}

// The recording that plays, else the one that was just made.
void MwRecordingsList::_preselect()
{
    std::string path = _model->getCurrentPlayPath();
    const std::string name = _model->getCurrentRecordingFileName();
    if (path.empty() && !name.empty()) {
        path = _model->getRecordingPath(name);
        _model->setCurrentRecordingFileName("");
    }
    if (path.empty())
        return;
    if (const Item* row = _rows->find(path); row)
        elm_radio_value_set(_radioGroup(), row->getIndex());
}

void MwRecordingsList::toggle(Item& item)
{
    item.setChecked(!item.isChecked());
    const bool checked = item.isChecked();
    Item* all = _rows->getSelectAll();
    bool areAllChecked = true;
    _rows->forEach([&](Item& row) {
        if (item.isSelectAll() && row.isChecked() != checked)
            row.setChecked(checked);
        areAllChecked = areAllChecked && row.isChecked();
        return true;
    });
    if (all && all->isChecked() != areAllChecked)
        all->setChecked(areAllChecked);
}

size_t MwRecordingsList::getCheckedCount() const { return getCheckedPaths().size(); }

std::vector<std::string> MwRecordingsList::getCheckedPaths() const
{
    return _rows && _mode->listType == Item::MULTIPLE_CHOICE ? _rows->getCheckedPaths() : std::vector<std::string>();
}

void MwRecordingsList::choose(const Item& row) { elm_radio_value_set(_radioGroup(), row.getIndex()); }

bool MwRecordingsList::hasChoice() const { return _genlist && elm_radio_value_get(_radioGroup()) > 0; }

std::string MwRecordingsList::getChosenPath() const
{
    const Item* row = _rows ? _rows->findByIndex(elm_radio_value_get(_radioGroup())) : nullptr;
    return row ? row->getPath() : std::string();
}

std::string MwRecordingsList::getHighlightedPath() const
{
    const Item* row = _rows ? _rows->getHighlighted() : nullptr;
    return row ? row->getPath() : std::string();
}

void MwRecordingsList::bringInItem()
{
    if (!_mode->plays || !_rows)
        return;
    const std::string path = _model->getCurrentPlayPath();
    if (path.empty()) {
        MW_LOGW("current play path is empty!!!");
        return;
    }
    if (const Item* row = _rows->find(path); row)
        elm_genlist_item_bring_in(row->getItem(), ELM_GENLIST_ITEM_SCROLLTO_IN);
}

// Once the panel is there: it makes the list shorter.
void MwRecordingsList::bringInAfterFrame()
{
    _cancelBringIn();
    evas_event_callback_add(evas_object_evas_get(_layout), EVAS_CALLBACK_RENDER_FLUSH_POST, _playerViewFulshPost, this);
}

void MwRecordingsList::_cancelBringIn()
{
    evas_event_callback_del_full(
        evas_object_evas_get(_layout), EVAS_CALLBACK_RENDER_FLUSH_POST, _playerViewFulshPost, this);
}

void MwRecordingsList::_playerViewFulshPost(void* data, Evas*, void*)
{
    auto* self = static_cast<MwRecordingsList*>(data);
    self->_cancelBringIn();
    self->bringInItem();
}

// Before the list makes a scroll of Left and Right; the rest is like the list's own, but for the mark, which the list
// moves only while its window has the keyboard.
void MwRecordingsList::_listenToListKeys()
{
    const auto pressed = [](void* data, Evas*, Evas_Object*, void* info) {
        auto* event = static_cast<Evas_Event_Key_Down*>(info);
        auto* self = static_cast<MwRecordingsList*>(data);
        if (self->_screen.onKey(event->key) || self->_listKeyPressed(event->key))
            event->event_flags = static_cast<Evas_Event_Flags>(event->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
    };
    // What has the keyboard when the list is focused is its inner object.
    evas_object_event_callback_priority_add(
        elm_layout_edje_get(_genlist), EVAS_CALLBACK_KEY_DOWN, EVAS_CALLBACK_PRIORITY_BEFORE, pressed, this);
    const auto unfocused = [](void* data, Evas_Object*, void*) {
        if (const auto* self = static_cast<MwRecordingsList*>(data); self->_rows)
            self->_rows->removeHighlight();
    };
    evas_object_smart_callback_add(_genlist, "unfocused", unfocused, this);
}

bool MwRecordingsList::_listKeyPressed(const std::string& key)
{
    if (!_rows)
        return false;
    if (key == "space" || key == "Return" || key == "KP_Enter") {
        if (Item* row = _rows->getHighlighted(); row)
            _screen.onSelected(*row);
        return true;
    }
    const int rows = rowsOfKey(key, _rows->getPage());
    if (rows != 0)
        _rows->moveHighlight(rows);
    return rows != 0;
}
