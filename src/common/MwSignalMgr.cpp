#include "MwSignalMgr.h"

#include <memory>

namespace {

std::unique_ptr<MwSignalMgr>& instance()
{
    static std::unique_ptr<MwSignalMgr> manager;
    return manager;
}

}

MwSignalMgr* MwSignalMgr::getInstance()
{
    if (!instance())
        instance() = std::make_unique<MwSignalMgr>();
    return instance().get();
}

void MwSignalMgr::destroyInstance() { instance().reset(); }

MwSignalMgr* MwSignalMgr::existing() { return instance().get(); }
