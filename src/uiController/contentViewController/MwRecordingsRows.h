#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include <panekit/WTimer.h>

#include "MwRecordingsListItem.h"

// The rows of the recordings list. Keeps a genlist in step with the model's catalogue by difference, so that rows stay
// where they are (and checked as they are) while others come and go; after many changes at once the list starts over,
// without checks. A long list appears with its first screens and
// grows in slices of a few milliseconds. The genlist is borrowed and outlives this object. Main loop only.
class MwRecordingsRows {
public:
    enum Files : int { ALL, OUTSIDE_PRIVATE, IN_PRIVATE, FOR_REQUEST };

    MwRecordingsRows(Evas_Object* genlist, const MwRecordingsListItem::Context& context);
    ~MwRecordingsRows();
    MwRecordingsRows(const MwRecordingsRows&) = delete;
    MwRecordingsRows& operator=(const MwRecordingsRows&) = delete;

    // What can be seen: rows from the top, with the pixels from the list's upper edge to their own. Empty while the
    // list shows its beginning, which it then goes on doing.
    struct Place {
        std::vector<std::string> paths;
        int top = 0;
        int rowHeight = 0;
    };
    [[nodiscard]] Place getPlace() const;
    // Scrolls so that the first of these rows that is left is where it was, if rows came or went.
    void restore(const Place& place);

    // Shows these files of the catalogue; costs nothing when that is what is shown.
    void show(Files files);
    // Whether that means to clear a list that is too long to be cleared at once: then rows in another list succeed
    // these.
    [[nodiscard]] bool isRenewalCheaper(Files files) const;
    void succeed(const MwRecordingsRows& former);
    // Loads what is missing. Whatever needs all rows does it by itself.
    void finish();

    void addSelectAll();
    void removeSelectAll();
    [[nodiscard]] MwRecordingsListItem* getSelectAll() const;

    // Rows of recordings in their order, until the function answers false.
    void forEach(const std::function<bool(MwRecordingsListItem&)>& function);
    // The same with those that are loaded already: the others are unchecked.
    void forEachLoaded(const std::function<bool(MwRecordingsListItem&)>& function) const;
    // Asks the database again, now or when a row comes into view.
    void forgetBookmarks();
    [[nodiscard]] MwRecordingsListItem* find(const std::string& path);
    [[nodiscard]] MwRecordingsListItem* findByIndex(int index);
    [[nodiscard]] std::vector<std::string> getCheckedPaths();
    // The row that the keyboard acts on, null for none. Moving it by rows keeps it in view; the first move goes to the
    // row that plays, else to the one on top.
    [[nodiscard]] MwRecordingsListItem* getHighlighted() const;
    void moveHighlight(int rows);
    void removeHighlight();
    // How many rows fit into the list.
    [[nodiscard]] int getPage() const;
    // Rows on screen, the one that selects all among them.
    void forEachRealized(const std::function<void(MwRecordingsListItem&)>& function) const;

private:
    using Item = MwRecordingsListItem;

    [[nodiscard]] bool _accepts(const MwFileInfo& info, Files files) const;
    [[nodiscard]] const std::vector<MwFileInfo>& _catalogue() const;
    [[nodiscard]] Item* _first() const;
    [[nodiscard]] static Item* _next(const Item* row);
    [[nodiscard]] std::unordered_map<std::string, Item*> _rowsByPath() const;
    using Paths = std::unordered_set<std::string_view>;
    // Of a row that went when the list started over.
    struct Former {
        int index = 0;
        bool isHighlighted = false;
    };

    [[nodiscard]] Paths _wantedPaths(Files files) const;
    struct Changes {
        size_t vanished = 0; // rows
        size_t added = 0; // before the last row that stays
        [[nodiscard]] bool areMany() const;
    };
    [[nodiscard]] Changes _findChanges(const Paths& wanted, Files files) const;
    void _startOver();
    void _remember(const MwRecordingsRows& rows);
    [[nodiscard]] Item* _make(const MwFileInfo& info);
    void _removeVanished(const Paths& wanted);
    void _closeGaps();
    void _followCatalogue();
    Item* _insert(const MwFileInfo& info, Item* after, Item* former);
    bool _loadSlice(double seconds);
    void _restoreAwaited();
    [[nodiscard]] Item* _highlightStart() const;
    [[nodiscard]] Item* _onTop() const;
    void _scrollTo(int y, int rowHeight);
    [[nodiscard]] int _scrolled() const;
    [[nodiscard]] int _yOf(const std::string& path, int rowHeight) const;

    Evas_Object* _genlist;
    const Item::Context& _context;
    Files _files = ALL;
    std::string _privateFolder; // with the slash
    unsigned int _revision = 0; // of the catalogue that is shown, 0 for none
    size_t _loaded = 0; // records of the catalogue that have been looked at
    int _lastIndex = 0;
    std::unordered_map<std::string, Former> _former; // until they are there again
    Place _awaited; // to be restored when its rows are there again
    bool _moved = false; // rows came since the place was restored
    panekit::WTimer::Weak _loader;
    panekit::WTimer::Weak _scroller; // until its place is there
};
