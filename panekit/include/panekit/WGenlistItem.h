#pragma once

#include <string>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;
struct _Elm_Gen_Item_Class;

namespace panekit {

// One row of a genlist. Owned by the list from append until the row is deleted. Main loop only.
class WGenlistItem {
public:
    WGenlistItem() = default;
    virtual ~WGenlistItem();
    WGenlistItem(const WGenlistItem&) = delete;
    WGenlistItem& operator=(const WGenlistItem&) = delete;

    // Appends the row with its style; answers the toolkit's item, null on failure.
    Evas_Object* append(Evas_Object* genlist, Evas_Object* after = nullptr);
    Evas_Object* prepend(Evas_Object* genlist);
    [[nodiscard]] Evas_Object* getItem() const { return _item; }
    [[nodiscard]] Evas_Object* getGenlist() const { return _genlist; }
    // The row of a toolkit item; null when it is none of ours.
    static WGenlistItem* fromItem(Evas_Object* item);

protected:
    virtual const char* getStyle() const = 0;
    // Markup of a text part.
    virtual std::string getText(const char* part);
    // A new content for a part, null for none.
    virtual Evas_Object* getContent(Evas_Object* genlist, const char* part);
    virtual void onSelected();
    virtual void onRealized();

private:
    struct Callbacks;
    friend struct Callbacks;
    const _Elm_Gen_Item_Class* _prepare(Evas_Object* genlist);
    Evas_Object* _adopt(Evas_Object* item);
    Evas_Object* _item = nullptr;
    Evas_Object* _genlist = nullptr;
};

}
