#include <panekit/WGenlistItem.h>

#include <cstring>
#include <map>

#include <Elementary.h>

namespace panekit {

namespace {

    constexpr auto REALIZED_KEY = "panekit.realized";

}

struct WGenlistItem::Callbacks {
    static char* text(void* data, Evas_Object*, const char* part)
    {
        const std::string text = static_cast<WGenlistItem*>(data)->getText(part);
        return text.empty() ? nullptr : ::strdup(text.c_str());
    }
    static Evas_Object* content(void* data, Evas_Object* genlist, const char* part)
    {
        return static_cast<WGenlistItem*>(data)->getContent(genlist, part);
    }
    static void deleted(void* data, Evas_Object*) { delete static_cast<WGenlistItem*>(data); }
    static void selected(void* data, Evas_Object*, void* item)
    {
        // Without this a second tap on the row would not be reported.
        elm_genlist_item_selected_set(static_cast<Elm_Object_Item*>(item), EINA_FALSE);
        static_cast<WGenlistItem*>(data)->onSelected();
    }
    static void realized(void*, Evas_Object*, void* item)
    {
        if (WGenlistItem* row = fromItem(static_cast<Elm_Object_Item*>(item)); row)
            row->onRealized();
    }
    // Item classes are shared by style for the life of the process.
    static const Elm_Genlist_Item_Class* itemClass(const std::string& style)
    {
        static std::map<std::string, Elm_Genlist_Item_Class*> classes;
        Elm_Genlist_Item_Class*& known = classes[style];
        if (!known) {
            known = elm_genlist_item_class_new();
            known->item_style = classes.find(style)->first.c_str();
            known->func.text_get = text;
            known->func.content_get = content;
            known->func.del = deleted;
        }
        return known;
    }
    static void watchRealized(Evas_Object* genlist)
    {
        if (evas_object_data_get(genlist, REALIZED_KEY))
            return;
        evas_object_data_set(genlist, REALIZED_KEY, genlist);
        evas_object_smart_callback_add(genlist, "realized", realized, nullptr);
    }
};

WGenlistItem::~WGenlistItem() = default;

Evas_Object* WGenlistItem::append(Evas_Object* genlist, Evas_Object* after)
{
    const Elm_Genlist_Item_Class* itemClass = _prepare(genlist);
    if (!itemClass)
        return nullptr;
    if (after)
        return _adopt(elm_genlist_item_insert_after(
            genlist, itemClass, this, nullptr, after, ELM_GENLIST_ITEM_NONE, Callbacks::selected, this));
    return _adopt(
        elm_genlist_item_append(genlist, itemClass, this, nullptr, ELM_GENLIST_ITEM_NONE, Callbacks::selected, this));
}

Evas_Object* WGenlistItem::prepend(Evas_Object* genlist)
{
    const Elm_Genlist_Item_Class* itemClass = _prepare(genlist);
    if (!itemClass)
        return nullptr;
    return _adopt(
        elm_genlist_item_prepend(genlist, itemClass, this, nullptr, ELM_GENLIST_ITEM_NONE, Callbacks::selected, this));
}

// The toolkit may ask for the texts of a row before it answers its item.
const Elm_Genlist_Item_Class* WGenlistItem::_prepare(Evas_Object* genlist)
{
    if (!genlist || _item)
        return nullptr;
    _genlist = genlist;
    Callbacks::watchRealized(genlist);
    return Callbacks::itemClass(getStyle());
}

Evas_Object* WGenlistItem::_adopt(Evas_Object* item)
{
    _item = item;
    if (!item)
        _genlist = nullptr;
    return item;
}

WGenlistItem* WGenlistItem::fromItem(Evas_Object* item)
{
    const Elm_Genlist_Item_Class* itemClass = item ? elm_genlist_item_item_class_get(item) : nullptr;
    const bool isOurs = itemClass && itemClass->func.del == Callbacks::deleted;
    return isOurs ? static_cast<WGenlistItem*>(elm_object_item_data_get(item)) : nullptr;
}

std::string WGenlistItem::getText(const char*) { return {}; }

Evas_Object* WGenlistItem::getContent(Evas_Object*, const char*) { return nullptr; }

void WGenlistItem::onSelected() { }

void WGenlistItem::onRealized() { }

}
