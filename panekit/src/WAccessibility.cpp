#define EFL_BETA_API_SUPPORT 1
#include <panekit/WAccessibility.h>

#include <Elementary.h>
#include <efl_access_object.eo.h>

#include <panekit/WLanguage.h>

namespace panekit {

void setAccessibleName(Evas_Object* object, const std::string& textId)
{
    if (object)
        efl_access_object_i18n_name_set(object, WLanguage::text(textId));
}

}
