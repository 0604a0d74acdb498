#include "MwRecordingsMenu.h"

#include <string>
#include <utility>
#include <vector>

#include <Elementary.h>

#include <media_content.h>
#include <panekit/WMenuPopupController.h>

#include "MwContentViewController.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwStorageRoots.h"
#include "MwSystemMgr.h"

namespace {

using MwRecordingsMenu::Item;

int bookmarkCount(const std::string& mediaId)
{
    int count = 0;
    if (const int result = media_info_get_bookmark_count_from_db(mediaId.c_str(), nullptr, &count); result != 0)
        MW_LOGE("media_info_get_bookmark_count_from_db : [%d]!!!", result);
    return count;
}

bool isBelow(const std::string& path, const std::string& root) { return path.starts_with(root + "/"); }

struct PrivateFiles {
    bool outside = false;
    bool inside = false;
};

PrivateFiles findPrivateFiles(const std::vector<MwFileInfo>& files)
{
    const std::string device = mwDeviceRoot();
    const std::string card = mwCardRoot();
    const std::string privateRoot = mwPrivateRoot();
    PrivateFiles found;
    for (const MwFileInfo& info : files) {
        if (isBelow(info.path, privateRoot))
            found.inside = true;
        else if (isBelow(info.path, device) || isBelow(info.path, card))
            found.outside = true;
    }
    return found;
}

// In their order.
std::vector<std::pair<const char*, Item>> itemsFor(const MwModel& model)
{
    using namespace MwRecordingsMenu;
    std::vector<std::pair<const char*, Item>> items;
    if (!model.getRecordedFileList().empty())
        items = {{"IDS_MW_OPT_DELETE", DELETE}, {"IDS_MW_BODY_SHARE", SHARE}, {"IDS_MUSIC_OPT_RENAME", RENAME}};
    const std::string path = model.getCurrentPlayPath();
    const MwFileInfo* info = path.empty() ? nullptr : model.getRecordedFileInfoByPath(path);
    if (info && bookmarkCount(info->mediaId) > 0)
        items.emplace_back("IDS_MW_BODY_BOOKMARKS", BOOKMARKS);
    if (info)
        items.emplace_back("IDS_MW_OPT_DETAILS", DETAILS);
    const MwSystemMgr* system = MwSystemMgr::getInstance();
    if (system->isPrivateModeInitialized() && !system->isUPSModeEnabled()) {
        const PrivateFiles files = findPrivateFiles(model.getRecordedFileList());
        if (files.outside)
            items.emplace_back("IDS_GALLERY_OPT_MOVE_TO_PRIVATE", MOVE_TO_PRIVATE);
        if (files.inside || model.hasHiddenRecordings())
            items.emplace_back("IDS_GALLERY_OPT_REMOVE_FROM_PRIVATE", REMOVE_FROM_PRIVATE);
        if (files.inside)
            items.emplace_back("IDS_MW_OPT_HIDE_PRIVATE_RECORDINGS", HIDE_PRIVATE);
        else if (model.hasHiddenRecordings())
            items.emplace_back("IDS_MW_OPT_SHOW_PRIVATE_RECORDINGS", SHOW_PRIVATE);
    }
    if (system->isMMCMounted())
        items.emplace_back("IDS_MW_HEADER_SAVE_TO", SAVE_TO);
    return items;
}

}

void MwRecordingsMenu::open(MwContentViewController& screen, const std::function<void(Item)>& chosen)
{
    auto* menu = new panekit::WMenuPopupController();
    for (const auto& [textId, item] : itemsFor(*screen.getModel()))
        menu->addItem(textId, [chosen, each = item] { chosen(each); });
    screen.attachPopup(menu);
    menu->create(screen.getWindow(), elm_object_item_widget_get(screen.getNaviItem()));
}
