#pragma once

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "MwRecordingsListItem.h"
#include "MwRecordingsRows.h"

struct MwRecordingsMode;

// The list of recordings in the recordings screen's layout, or what is shown while there is none: at most one of the
// two. It follows the model's catalogue and the screen's mode, and knows which rows are checked or chosen. Layout and
// model are borrowed. Main loop only.
class MwRecordingsList {
public:
    using Item = MwRecordingsListItem;
    struct Screen {
        std::function<void(Item& row)> onSelected;
        // Asked before the list itself takes a key; true when it is taken.
        std::function<bool(const std::string& key)> onKey;
        std::function<void()> onListCreated;
    };

    // mode: one of those that are there for good.
    MwRecordingsList(Evas_Object* layout, MwModel* model, const MwRecordingsMode& mode, Screen screen);
    ~MwRecordingsList();
    MwRecordingsList(const MwRecordingsList&) = delete;
    MwRecordingsList& operator=(const MwRecordingsList&) = delete;

    // The rows go before the records that they show; the list itself goes with the layout.
    void close();
    void setMode(const MwRecordingsMode& mode) { _mode = &mode; }
    // Changes places between list and empty view as the catalogue asks. What is shown stays, when it is still the right
    // one: rows then follow the catalogue one by one.
    void load();
    // Redraws everything from the model. Rows follow every change of the catalogue: those of records that were removed
    // from it vanish, renamed ones are rewritten.
    void update();
    void refreshRealizedItems();
    void forgetBookmarks();
    // Dates follow another region or time zone.
    void renewDates();
    // The empty view's colours follow the theme.
    void colourNoContents();

    void setDisabled(bool disabled);
    [[nodiscard]] bool isShown() const { return _genlist != nullptr; }
    void focus();
    // The row that plays comes into view, now or once the panel that makes the list shorter is there.
    void bringInItem();
    void bringInAfterFrame();

    // A tap where rows are checked.
    void toggle(Item& row);
    [[nodiscard]] size_t getCheckedCount() const;
    [[nodiscard]] std::vector<std::string> getCheckedPaths() const;
    // A tap where one row is chosen.
    void choose(const Item& row);
    // Empty when there is no such row any more.
    [[nodiscard]] std::string getChosenPath() const;
    [[nodiscard]] bool hasChoice() const;
    // Of the row that the arrow keys went to, empty for none.
    [[nodiscard]] std::string getHighlightedPath() const;

private:
    void _takeDownContents();
    void _createNoContents();
    void _createList();
    void _renewList();
    void _makeRows();
    [[nodiscard]] Evas_Object* _radioGroup() const;
    void _updateChoice();
    void _clearChecks();
    void _preselect();
    void _cancelBringIn();
    static void _playerViewFulshPost(void* data, Eo* canvas, void* info);
    void _listenToListKeys();
    bool _listKeyPressed(const std::string& key);

    Evas_Object* _layout;
    MwModel* _model;
    const MwRecordingsMode* _mode;
    Screen _screen;
    Item::Context _rowContext; // shared by all rows
    Evas_Object* _genlist = nullptr;
    Evas_Object* _noContents = nullptr;
    std::unique_ptr<MwRecordingsRows> _rows; // with the genlist
};
