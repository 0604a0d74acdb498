#pragma once

#include <functional>
#include <optional>
#include <string>

#include <panekit/WGenlistItem.h>

#include "MwModel.h"

// One row of the recordings list, or the one that selects all. Owned by the genlist, which keeps the radio group under
// the data key "radio" and the date formatter under "icu". Main loop only.
class MwRecordingsListItem : public panekit::WGenlistItem {
public:
    enum ListType : int { NO_CHOICE, SINGLE_CHOICE, MULTIPLE_CHOICE };

    // What all rows of a list share; outlives them.
    struct Context {
        MwModel* model = nullptr;
        std::function<ListType()> getListType;
        std::function<void(MwRecordingsListItem& item)> onSelected;
    };

    // index: the row's value in the radio group, from 1.
    MwRecordingsListItem(const Context& context, MwFileInfo info, int index, bool isHighlighted = false);
    // The row that selects all.
    explicit MwRecordingsListItem(const Context& context);

    // The row behind an item of a recordings list, null for none.
    static MwRecordingsListItem* from(Evas_Object* item);

    [[nodiscard]] bool isSelectAll() const { return !_info; }
    // Empty for the row that selects all.
    [[nodiscard]] const std::string& getPath() const;
    [[nodiscard]] const MwFileInfo* getFileInfo() const { return _info ? &*_info : nullptr; }
    // Takes over a changed record and redraws; the same record costs nothing.
    void setFileInfo(const MwFileInfo& info);
    [[nodiscard]] int getIndex() const { return _index; }
    [[nodiscard]] bool isChecked() const { return _checked; }
    // Also shows it, when the row is on screen.
    void setChecked(bool checked);
    // Check and mark of a row whose place this one takes.
    void takeOver(const MwRecordingsListItem& former);
    // The mark of the row that the keyboard acts on.
    void setHighlighted(bool highlighted);
    [[nodiscard]] bool isHighlighted() const { return _highlighted; }
    // Writes texts, mark of the current row and its check or radio anew. For rows on screen.
    void refresh();
    // Asks the database for bookmarks again when the row is shown next.
    void forgetBookmarks() { _bookmarked.reset(); }
    // For rows on screen.
    void refreshBookmarks();

protected:
    const char* getStyle() const override;
    std::string getText(const char* part) override;
    Evas_Object* getContent(Evas_Object* genlist, const char* part) override;
    void onSelected() override;
    void onRealized() override;

private:
    [[nodiscard]] bool _isCurrent() const;
    [[nodiscard]] std::string _coloured(const std::string& markup, const char* code) const;
    [[nodiscard]] std::string _nameText() const;
    [[nodiscard]] std::string _dateText() const;
    [[nodiscard]] std::string _durationText() const;
    [[nodiscard]] bool _hasBookmarks();
    Evas_Object* _createChoice(Evas_Object* genlist);
    Evas_Object* _createRadio(Evas_Object* layout, Evas_Object* genlist) const;
    Evas_Object* _createCheck(Evas_Object* layout) const;
    void _emitState();

    const Context& _context;
    std::optional<MwFileInfo> _info;
    int _index = 0;
    bool _checked = false;
    bool _highlighted = false;
    std::optional<bool> _bookmarked; // not asked yet
};
