#include "MwResourceMgr.h"

#include <app.h>

#include <memory>

#include "MwLog.h"
#include "MwText.h"

namespace {

std::unique_ptr<MwResourceMgr>& instance()
{
    static std::unique_ptr<MwResourceMgr> manager;
    return manager;
}

}

MwResourceMgr* MwResourceMgr::getInstance()
{
    if (!instance())
        instance() = std::make_unique<MwResourceMgr>();
    return instance().get();
}

void MwResourceMgr::destroyInstance() { instance().reset(); }

MwResourceMgr::~MwResourceMgr()
{
    if (app_resource_manager_release() != 0)
        MW_LOGE("FATAL ERROR! FAILED TO RELEASE RESOURCE MANAGER!");
}

bool MwResourceMgr::initialize()
{
    MW_LOGW("ENTER");
    if (app_resource_manager_init() != 0) {
        MW_LOGE("FATAL ERROR! FAILED TO INIT RESOURCE MANAGER!");
        return false;
    }
    MW_LOGW("END");
    return true;
}

bool MwResourceMgr::getEdjPath(const char* name, std::string& path)
{
    char* found = nullptr;
    const int result = app_resource_manager_get(APP_RESOURCE_TYPE_IMAGE, name, &found);
    if (result != 0 || found == nullptr) {
        MW_LOGE("app_resource_manager_get failed!!! err: %d", result);
        return false;
    }
    path = mwAdopt(found);
    return true;
}
