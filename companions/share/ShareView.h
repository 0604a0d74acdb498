#pragma once

#include <functional>
#include <string>
#include <vector>

#include "ShareWays.h"

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

// The chooser: what is shared, and a row for each way to do it. Fills its window, which deletes it. Main loop only.
class ShareView {
public:
    using Choice = std::function<void(const share::Way& way)>;

    ShareView(Evas_Object* window, const std::string& layoutFile);
    ShareView(const ShareView&) = delete;
    ShareView& operator=(const ShareView&) = delete;

    // Another request replaces what is shown.
    void show(const std::vector<std::string>& paths, Choice choice, std::function<void()> closed);

private:
    struct Row {
        ShareView* view;
        size_t way;
    };

    void _addRow(size_t way);
    static void _clickedCb(void* data, Evas_Object* button, void* info);
    static void _backCb(void* data, Evas_Object* layout, void* info);

    Evas_Object* _layout;
    Evas_Object* _box = nullptr;
    std::vector<share::Way> _ways;
    std::vector<Row> _rows; // filled once for each request: callbacks point into it
    Choice _choice;
    std::function<void()> _closed;
};
