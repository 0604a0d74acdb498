#include "MwRecordingsRows.h"

#include <Elementary.h>

#include <algorithm>
#include <cstdlib>
#include <optional>
#include <string_view>
#include <utility>

#include "MwModel.h"
#include "MwStorageRoots.h"

using panekit::WTimer;

namespace {

// Enough for the tallest window; the rest comes while the first rows can be seen and used already.
constexpr size_t FIRST_ROWS = 64;
// Each row that comes in between has the toolkit lay out the list at once, at its end thousands are laid out together.
constexpr size_t MOST_CHANGES = 128;
constexpr unsigned int MOST_TO_CLEAR = 256;
constexpr double FIRST_FRAME_SECONDS = 0.03;
constexpr double SLICE_SECONDS = 0.004;
constexpr int SELECT_ALL_HEIGHT = 112; // design units, as in its layout
constexpr size_t ROWS_BETWEEN_LOOKS_AT_THE_CLOCK = 32;

struct Box {
    int y = 0;
    int height = 0;
};

Box boxOf(Evas_Object* object)
{
    Box box;
    evas_object_geometry_get(object, nullptr, &box.y, nullptr, &box.height);
    return box;
}

// Of a row on screen.
Box boxOfRow(Elm_Object_Item* item)
{
    Evas_Object* rectangle = elm_object_item_track(item);
    if (!rectangle)
        return {};
    const Box box = boxOf(rectangle);
    elm_object_item_untrack(item);
    return box;
}

}

MwRecordingsRows::MwRecordingsRows(Evas_Object* genlist, const Item::Context& context)
    : _genlist(genlist)
    , _context(context)
    , _privateFolder(mwPrivateRoot() + "/")
{
}

MwRecordingsRows::~MwRecordingsRows()
{
    WTimer::destroy(_loader);
    WTimer::destroy(_scroller);
}

const std::vector<MwFileInfo>& MwRecordingsRows::_catalogue() const { return _context.model->getRecordedFileList(); }

bool MwRecordingsRows::_accepts(const MwFileInfo& info, Files files) const
{
    if (files == FOR_REQUEST)
        return _context.model->fitsRequest(info.path);
    return files == ALL || info.path.starts_with(_privateFolder) == (files == IN_PRIVATE);
}

MwRecordingsListItem* MwRecordingsRows::_first() const
{
    Item* row = Item::from(elm_genlist_first_item_get(_genlist));
    return row && row->isSelectAll() ? _next(row) : row;
}

MwRecordingsListItem* MwRecordingsRows::_next(const Item* row)
{
    return Item::from(elm_genlist_item_next_get(row->getItem()));
}

MwRecordingsListItem* MwRecordingsRows::getSelectAll() const
{
    Item* row = Item::from(elm_genlist_first_item_get(_genlist));
    return row && row->isSelectAll() ? row : nullptr;
}

void MwRecordingsRows::show(Files files)
{
    const unsigned int revision = _context.model->getCatalogueRevision();
    if (files == _files && revision == _revision)
        return;
    _files = files;
    _revision = revision;
    const Paths wanted = _wantedPaths(files);
    const Changes changes = _findChanges(wanted, files);
    if (changes.areMany())
        _startOver();
    else if (changes.vanished > 0)
        _removeVanished(wanted);
    _followCatalogue();
    if (_loaded < _catalogue().size() && _loader.expired())
        _loader = WTimer::addTimer(FIRST_FRAME_SECONDS, [this](void*) {
            _loader = WTimer::addIdler([this](void*) { return _loadSlice(SLICE_SECONDS); });
            return false;
        });
}

void MwRecordingsRows::finish()
{
    show(_files);
    while (_loadSlice(SLICE_SECONDS)) { }
}

MwRecordingsRows::Paths MwRecordingsRows::_wantedPaths(Files files) const
{
    Paths paths;
    if (!_first())
        return paths;
    for (const MwFileInfo& info : _catalogue()) {
        if (_accepts(info, files))
            paths.insert(info.path);
    }
    return paths;
}

bool MwRecordingsRows::Changes::areMany() const { return vanished + added > MOST_CHANGES; }

MwRecordingsRows::Changes MwRecordingsRows::_findChanges(const Paths& wanted, Files files) const
{
    Changes changes;
    std::vector<const Item*> staying;
    forEachLoaded([&](const Item& row) {
        if (wanted.contains(row.getPath()))
            staying.push_back(&row);
        else
            ++changes.vanished;
        return true;
    });
    auto row = staying.begin();
    for (auto info = _catalogue().begin(); info != _catalogue().end() && row != staying.end(); ++info) {
        if ((*row)->getPath() == info->path)
            ++row;
        else if (_accepts(*info, files))
            ++changes.added;
    }
    return changes;
}

// All rows go and come again; what is chosen and where the keyboard is stays.
void MwRecordingsRows::_startOver()
{
    const bool hasSelectAll = getSelectAll();
    _remember(*this);
    elm_genlist_clear(_genlist);
    if (hasSelectAll)
        addSelectAll();
    _moved = true;
}

void MwRecordingsRows::_remember(const MwRecordingsRows& rows)
{
    rows.forEachLoaded([this](const Item& row) {
        _former[row.getPath()] = {row.getIndex(), row.isHighlighted()};
        return true;
    });
}

bool MwRecordingsRows::isRenewalCheaper(Files files) const
{
    const bool isShown = files == _files && _context.model->getCatalogueRevision() == _revision;
    return !isShown && elm_genlist_items_count(_genlist) > MOST_TO_CLEAR
        && _findChanges(_wantedPaths(files), files).areMany();
}

void MwRecordingsRows::succeed(const MwRecordingsRows& former)
{
    _former = former._former;
    _remember(former);
    _lastIndex = former._lastIndex;
    _awaited = former._awaited;
    if (former.getSelectAll())
        addSelectAll();
    _moved = true;
}

MwRecordingsListItem* MwRecordingsRows::_make(const MwFileInfo& info)
{
    const auto former = _former.extract(info.path);
    if (former.empty())
        return new Item(_context, info, ++_lastIndex);
    return new Item(_context, info, former.mapped().index, former.mapped().isHighlighted);
}

void MwRecordingsRows::_removeVanished(const Paths& wanted)
{
    forEachLoaded([&](const Item& row) {
        if (!wanted.contains(row.getPath()))
            elm_object_item_del(row.getItem());
        return true;
    });
    _closeGaps();
}

// Where rows went out of sight the list keeps their room until a row comes; so its last one comes again.
void MwRecordingsRows::_closeGaps()
{
    Item* last = Item::from(elm_genlist_last_item_get(_genlist));
    if (!last || last->isSelectAll())
        return;
    Item* above = Item::from(elm_genlist_item_prev_get(last->getItem()));
    _insert(MwFileInfo(*last->getFileInfo()), above, last);
}

std::unordered_map<std::string, MwRecordingsListItem*> MwRecordingsRows::_rowsByPath() const
{
    std::unordered_map<std::string, Item*> rows;
    for (Item* row = _first(); row; row = _next(row))
        rows.emplace(row->getPath(), row);
    return rows;
}

// Walks along the rows that there are and puts in between what is new; what comes after the last one is left to the
// slices, but for the first screens.
void MwRecordingsRows::_followCatalogue()
{
    std::optional<std::unordered_map<std::string, Item*>> known; // asked for when a row is not in its place
    Item* row = _first();
    Item* above = getSelectAll();
    size_t rows = 0;
    for (_loaded = 0; _loaded < _catalogue().size() && (row || rows < FIRST_ROWS); ++_loaded) {
        const MwFileInfo& info = _catalogue()[_loaded];
        if (!_accepts(info, _files))
            continue;
        ++rows;
        if (row && row->getPath() == info.path) {
            row->setFileInfo(info);
            above = std::exchange(row, _next(row));
            continue;
        }
        if (!known)
            known = _rowsByPath();
        const auto former = known->find(info.path);
        above = _insert(info, above, former != known->end() ? former->second : nullptr);
    }
}

// A row that moved to another place (former) stays the same for the user: checked or chosen as it was.
MwRecordingsListItem* MwRecordingsRows::_insert(const MwFileInfo& info, Item* above, Item* former)
{
    auto* row = former ? new Item(_context, info, former->getIndex()) : _make(info);
    if (former) {
        row->takeOver(*former);
        elm_object_item_del(former->getItem());
    }
    _moved = true;
    if (above)
        row->append(_genlist, above->getItem());
    else
        row->prepend(_genlist);
    return row;
}

// False when all is loaded.
bool MwRecordingsRows::_loadSlice(double seconds)
{
    show(_files);
    const double end = ecore_time_get() + seconds;
    bool isPlaceThere = false;
    for (size_t count = 1; _loaded < _catalogue().size(); ++count) {
        const MwFileInfo& info = _catalogue()[_loaded++];
        if (_accepts(info, _files))
            _make(info)->append(_genlist);
        isPlaceThere = isPlaceThere || (!_awaited.paths.empty() && info.path == _awaited.paths.front());
        if (count % ROWS_BETWEEN_LOOKS_AT_THE_CLOCK == 0 && ecore_time_get() > end)
            break;
    }
    const bool isMore = _loaded < _catalogue().size();
    if (isPlaceThere || !isMore)
        _restoreAwaited();
    if (!isMore)
        _former.clear();
    return isMore;
}

// Unless the user has gone elsewhere meanwhile.
void MwRecordingsRows::_restoreAwaited()
{
    const Place place = std::exchange(_awaited, {});
    if (place.paths.empty() || _scrolled() > 0)
        return;
    _moved = true;
    restore(place);
}

void MwRecordingsRows::addSelectAll()
{
    if (getSelectAll())
        return;
    (new Item(_context))->prepend(_genlist);
    _moved = true;
}

void MwRecordingsRows::removeSelectAll()
{
    const Item* row = getSelectAll();
    if (!row)
        return;
    elm_object_item_del(row->getItem());
    _closeGaps();
}

void MwRecordingsRows::forEach(const std::function<bool(Item&)>& function)
{
    finish();
    forEachLoaded(function);
}

void MwRecordingsRows::forEachLoaded(const std::function<bool(Item&)>& function) const
{
    for (Item* row = _first(); row;) {
        Item* next = _next(row);
        if (!function(*row))
            return;
        row = next;
    }
}

void MwRecordingsRows::forgetBookmarks()
{
    forEachLoaded([](Item& row) {
        row.forgetBookmarks();
        return true;
    });
    forEachRealized([](Item& row) { row.refreshBookmarks(); });
}

MwRecordingsListItem* MwRecordingsRows::find(const std::string& path)
{
    Item* found = nullptr;
    forEach([&](Item& row) {
        if (row.getPath() == path)
            found = &row;
        return !found;
    });
    return found;
}

MwRecordingsListItem* MwRecordingsRows::findByIndex(int index)
{
    Item* found = nullptr;
    forEach([&](Item& row) {
        if (row.getIndex() == index)
            found = &row;
        return !found;
    });
    return found;
}

std::vector<std::string> MwRecordingsRows::getCheckedPaths()
{
    std::vector<std::string> paths;
    forEach([&](const Item& row) {
        if (row.isChecked())
            paths.push_back(row.getPath());
        return true;
    });
    return paths;
}

MwRecordingsListItem* MwRecordingsRows::getHighlighted() const
{
    for (Item* row = Item::from(elm_genlist_first_item_get(_genlist)); row; row = _next(row)) {
        if (row->isHighlighted())
            return row;
    }
    return nullptr;
}

MwRecordingsListItem* MwRecordingsRows::_highlightStart() const
{
    Item* start = _onTop();
    const std::string path = _context.model->getCurrentPlayPath();
    forEachLoaded([&](Item& row) {
        if (row.getPath() == path)
            start = &row;
        return true;
    });
    return start;
}

void MwRecordingsRows::moveHighlight(int rows)
{
    finish();
    Item* from = getHighlighted();
    Item* to = from ? from : _highlightStart();
    for (int left = from ? std::abs(rows) : 0; left > 0; --left) {
        Elm_Object_Item* next
            = rows > 0 ? elm_genlist_item_next_get(to->getItem()) : elm_genlist_item_prev_get(to->getItem());
        if (!next)
            break;
        to = Item::from(next);
    }
    if (!to)
        return;
    if (from)
        from->setHighlighted(false);
    to->setHighlighted(true);
    elm_genlist_item_show(to->getItem(), ELM_GENLIST_ITEM_SCROLLTO_IN);
}

void MwRecordingsRows::removeHighlight()
{
    if (Item* row = getHighlighted(); row)
        row->setHighlighted(false);
}

int MwRecordingsRows::getPage() const
{
    Eina_List* items = elm_genlist_realized_items_get(_genlist);
    const int count = static_cast<int>(eina_list_count(items));
    eina_list_free(items);
    return std::max(1, count - 1);
}

MwRecordingsListItem* MwRecordingsRows::_onTop() const
{
    int x = 0;
    int y = 0;
    int where = 0;
    evas_object_geometry_get(_genlist, &x, &y, nullptr, nullptr);
    Elm_Object_Item* item = elm_genlist_at_xy_item_get(_genlist, x + 1, y + 1, &where);
    return Item::from(item ? item : elm_genlist_first_item_get(_genlist));
}

void MwRecordingsRows::forEachRealized(const std::function<void(Item&)>& function) const
{
    Eina_List* items = elm_genlist_realized_items_get(_genlist);
    void* item = nullptr;
    EINA_LIST_FREE(items, item)
    {
        if (Item* row = Item::from(static_cast<Elm_Object_Item*>(item)); row)
            function(*row);
    }
}

MwRecordingsRows::Place MwRecordingsRows::getPlace() const
{
    const Item* row = _scrolled() > 0 ? _onTop() : nullptr;
    if (!row)
        return {};
    const Box box = boxOfRow(row->getItem());
    Place place{{}, box.y - boxOf(_genlist).y, box.height};
    if (row->isSelectAll()) {
        place.top += box.height;
        row = _next(row);
        place.rowHeight = row ? boxOfRow(row->getItem()).height : 0;
    }
    for (; row && place.paths.size() < FIRST_ROWS; row = _next(row))
        place.paths.push_back(row->getPath());
    return place;
}

// Where a row begins within all rows; -1 for one that is not there.
int MwRecordingsRows::_yOf(const std::string& path, int rowHeight) const
{
    int y = getSelectAll() ? ELM_SCALE_SIZE(SELECT_ALL_HEIGHT) : 0;
    bool found = false;
    forEachLoaded([&](const Item& row) {
        found = row.getPath() == path;
        y += found ? 0 : rowHeight;
        return !found;
    });
    return found ? y : -1;
}

// The list itself keeps what is seen in its place, but its scroller goes on counting from where it was, and the next
// scrolling would jump.
void MwRecordingsRows::restore(const Place& place)
{
    if (!std::exchange(_moved, false))
        return;
    int y = 0;
    bool isThere = place.paths.empty();
    for (size_t i = 0; i < place.paths.size(); ++i) {
        const int top = _yOf(place.paths[i], place.rowHeight);
        if (top < 0)
            continue;
        y = std::max(0, top - place.top - static_cast<int>(i) * place.rowHeight);
        isThere = true;
        break;
    }
    if (!isThere && _loaded < _catalogue().size())
        _awaited = place;
    evas_smart_objects_calculate(evas_object_evas_get(_genlist)); // with all rows there are now
    _scrollTo(y, place.rowHeight);
}

// The list gives its rows their places when there is nothing else to do, and does not scroll to where none is yet.
void MwRecordingsRows::_scrollTo(int y, int rowHeight)
{
    WTimer::destroy(_scroller);
    int height = 0;
    evas_object_geometry_get(_genlist, nullptr, nullptr, nullptr, &height);
    elm_scroller_region_show(_genlist, 0, y, 1, height);
    const int reached = _scrolled();
    if (reached == y)
        return;
    _scroller = WTimer::addIdler([this, y, rowHeight, reached](void*) {
        if (_scrolled() != reached)
            return false; // by the user
        int all = 0;
        elm_scroller_child_size_get(_genlist, nullptr, &all);
        int seen = 0;
        evas_object_geometry_get(_genlist, nullptr, nullptr, nullptr, &seen);
        const bool isThere = all >= y + seen;
        const bool isLaidOut = all >= static_cast<int>(elm_genlist_items_count(_genlist)) * rowHeight;
        if (isThere || isLaidOut)
            elm_scroller_region_show(_genlist, 0, y, 1, seen);
        return !isThere && !isLaidOut;
    });
}

int MwRecordingsRows::_scrolled() const
{
    int y = 0;
    elm_scroller_region_get(_genlist, nullptr, &y, nullptr, nullptr);
    return y;
}
