#pragma once

#include <string>

typedef struct _Eo_Opaque Eo;
typedef Eo Evas_Object;

namespace panekit {

// What a screen reader says for a control without a text of its own. textId: a string identifier, translated now.
void setAccessibleName(Evas_Object* object, const std::string& textId);

}
