#include "MwFeatureChecker.h"

#include "MwLog.h"
#include "MwSystemMgr.h"

namespace {

constexpr int MODEL_WITHOUT_TRIM = 1;

}

bool MwFeatureChecker::isEnable(int menuType)
{
    if (menuType == MENU_TYPE_TRIM)
        return MwSystemMgr::getInstance()->getModelType() != MODEL_WITHOUT_TRIM;
    MW_LOGE("invalid menu type[%d]", menuType);
    return false;
}
