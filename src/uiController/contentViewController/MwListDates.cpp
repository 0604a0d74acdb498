#include "MwListDates.h"

#include <Elementary.h>

#include "MwLog.h"

namespace {

constexpr auto ICU_KEY = "icu";

void deleteFormatterCb(void*, Evas*, Evas_Object* genlist, void*)
{
    delete static_cast<MwICU*>(evas_object_data_del(genlist, ICU_KEY));
}

}

void mwRenewDates(Evas_Object* genlist)
{
    auto* former = static_cast<MwICU*>(evas_object_data_del(genlist, ICU_KEY));
    if (!former)
        evas_object_event_callback_add(genlist, EVAS_CALLBACK_DEL, deleteFormatterCb, nullptr);
    delete former;
    evas_object_data_set(genlist, ICU_KEY, new MwICU);
}

std::string mwDateText(Evas_Object* genlist, time_t time, MwICU::Kind kind)
{
    auto* icu = static_cast<MwICU*>(evas_object_data_get(genlist, ICU_KEY));
    if (!icu) {
        MW_LOGE("icu == nullptr!!!");
        return {};
    }
    return icu->getICUstring(time, kind).value_or("");
}
