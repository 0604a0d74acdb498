#include "MwDetailsTexts.h"

#include <algorithm>
#include <array>
#include <utility>

#include "MwLog.h"
#include "MwModel.h"
#include "MwStorageRoots.h"
#include "MwText.h"

namespace {

constexpr double UNIT = 1024.0;

bool isInside(const std::string& folder, const std::string& root)
{
    return !root.empty() && folder.starts_with(root) && (folder.size() == root.size() || folder[root.size()] == '/');
}

}

std::string mwLocationText(const std::string& path)
{
    if (path.empty()) {
        MW_LOGE("filePath is nullptr");
        return {};
    }
    const size_t slash = path.rfind('/');
    if (slash == std::string::npos) {
        MW_LOGE("dirPath is nullptr!!");
        return {};
    }
    const std::string folder = path.substr(0, slash);
    const std::pair<std::string, const char*> storages[] = {{mwDeviceRoot(), "IDS_VIDEO_SBODY_DEVICE_STORAGE"},
        {mwCardRoot(), "IDS_VIDEO_SBODY_SD_CARD"}, {mwPrivateRoot(), "IDS_GALLERY_OPT_PRIVATE_M_CONTENT"}};
    for (const auto& [root, label] : storages) {
        if (isInside(folder, root))
            return mwFormat("/%s/%s", mwTranslate(label).c_str(), path.substr(root.size() + 1).c_str());
    }
    return folder;
}

std::string mwSizeText(double bytes)
{
    constexpr std::array<const char*, 4> NAMES = {"B", "KB", "MB", "GB"};
    size_t divisions = 0;
    for (; bytes >= UNIT; ++divisions)
        bytes /= UNIT;
    return divisions < NAMES.size() ? mwFormat("%.1f %s", bytes, NAMES[divisions]) : std::string();
}

std::string mwLengthText(int duration) { return MwModel::getLengthText(duration); }
