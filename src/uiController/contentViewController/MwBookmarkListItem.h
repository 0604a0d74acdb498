#pragma once

#include <functional>
#include <optional>
#include <string>

#include <panekit/WGenlistItem.h>

#include "MwSavedBookmarks.h"

// A row of the bookmarks screen: a bookmark, or the row that selects all. Owned by the genlist, which keeps the radio
// group under the data key "radio". Main loop only.
class MwBookmarkListItem : public panekit::WGenlistItem {
public:
    enum Mode : int { NORMAL = 1, RENAME = 2, DELETE = 3 };
    using Selected = std::function<void(MwBookmarkListItem& item)>;

    // index: the row's value in the radio group, from 1.
    MwBookmarkListItem(MwSavedBookmark bookmark, int index, Selected onSelected);
    // The row that selects all.
    explicit MwBookmarkListItem(Selected onSelected);

    [[nodiscard]] bool isSelectAll() const { return !_bookmark; }
    // Only of a row that shows one.
    [[nodiscard]] const MwSavedBookmark& getBookmark() const { return *_bookmark; }
    [[nodiscard]] int getIndex() const { return _index; }
    [[nodiscard]] bool isChecked() const { return _checked; }
    // Also shows it, when the row is on screen.
    void setChecked(bool checked);
    // Which control the row carries: none, a radio or a check.
    void setMode(Mode mode);

    // "01:02:05". Seconds; a negative time counts as none.
    static std::string timeText(long long seconds);

protected:
    const char* getStyle() const override;
    std::string getText(const char* part) override;
    Evas_Object* getContent(Evas_Object* genlist, const char* part) override;
    void onSelected() override;

private:
    [[nodiscard]] Evas_Object* _createRadio(Evas_Object* layout) const;
    [[nodiscard]] Evas_Object* _createCheck(Evas_Object* layout) const;

    Mode _mode;
    std::optional<MwSavedBookmark> _bookmark;
    bool _checked = false;
    int _index = 0;
    Selected _onSelected;
};
