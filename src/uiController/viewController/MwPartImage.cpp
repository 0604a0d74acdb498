#include "MwPartImage.h"

#include <Elementary.h>

#include <uxt_theme.h>

#include "MwLog.h"
#include "MwResourceMgr.h"

namespace {

constexpr auto IMAGE_FILE = "edje/MwImages.edj";

}

bool mwSetPartImage(Evas_Object* button, const char* part, const char* image, const char* color)
{
    std::string path;
    if (!MwResourceMgr::getInstance()->getEdjPath(IMAGE_FILE, path) || path.empty()) {
        MW_LOGE("getEdjPath fail");
        return false;
    }
    Evas_Object* icon = elm_image_add(button);
    elm_image_file_set(icon, path.c_str(), image);
    uxt_theme_object_set_color(icon, color);
    elm_object_part_content_set(button, part, icon);
    evas_object_show(icon);
    return true;
}
