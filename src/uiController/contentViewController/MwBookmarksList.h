#pragma once

#include <functional>
#include <string>
#include <vector>

#include "MwBookmarkListItem.h"

// The rows of the bookmarks screen: the bookmarks of one recording in the screen's layout, which owns the list. What
// the user changes goes to the database at once. Main loop only.
class MwBookmarksList {
public:
    using Item = MwBookmarkListItem;
    struct Screen {
        std::function<void(Item& row)> onSelected;
        // Asked before the list itself takes a key; true when it is taken.
        std::function<bool(const std::string& key)> onKey;
    };

    MwBookmarksList(Evas_Object* layout, std::string mediaId, Screen screen);
    MwBookmarksList(const MwBookmarksList&) = delete;
    MwBookmarksList& operator=(const MwBookmarksList&) = delete;

    // Reads the bookmarks again; the row on top stays there.
    void reload();
    void setMode(Item::Mode mode);
    // Texts follow another region.
    void refresh();

    [[nodiscard]] bool isEmpty() const { return _rows().empty(); }
    [[nodiscard]] int getCheckedCount() const;
    // A tap where rows are checked, also on the one that selects all.
    void toggle(Item& row);
    // A tap where one row is chosen.
    void choose(const Item& row);

    // Whether a bookmark other than this one has the name.
    [[nodiscard]] bool isNameTaken(int bookmark, const std::string& name) const;
    void rename(int bookmark, const std::string& name);
    void deleteChecked();

private:
    void _createList(Evas_Object* layout);
    void _loadListItems();
    static void _listKeyCb(void* data, Eo* canvas, Evas_Object* list, void* info);
    [[nodiscard]] std::vector<Item*> _rows() const;
    void _clearSelection();
    void _createRadioGroup();
    void _appendSelectAllItem();
    void _removeSelectAllItem();
    void _replace(const MwSavedBookmark& bookmark, const std::string& name) const;

    std::string _mediaId;
    Screen _screen;
    Evas_Object* _genlist = nullptr;
    Evas_Object* _radio = nullptr; // the group of the rename mode
    Item* _selectAllItem = nullptr; // in the delete mode
};
