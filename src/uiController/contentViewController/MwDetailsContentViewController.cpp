#include "MwDetailsContentViewController.h"

#include <Ecore_File.h>
#include <Elementary.h>

#include <utility>

#include "MwDetailsListItem.h"
#include "MwListDates.h"
#include "MwLog.h"
#include "MwNaviButtons.h"

namespace {

constexpr auto LIST_PART = "elm.swallow.content";
constexpr auto FILE_INFO_KEY = "file_info";

}

MwDetailsContentViewController::MwDetailsContentViewController(
    MwModel* model, MwAppController* appController, MwFileInfo fileInfo)
    : MwContentViewController(model, appController)
    , _fileInfo(std::move(fileInfo))
{
}

MwDetailsContentViewController::~MwDetailsContentViewController() = default;

Evas_Object* MwDetailsContentViewController::onCreateView(Evas_Object* parent, void*)
{
    Evas_Object* layout = elm_layout_add(parent);
    elm_layout_theme_set(layout, "layout", "application", "default");
    evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
    evas_object_show(layout);
    setTitle("IDS_MW_OPT_DETAILS");
    return layout;
}

void MwDetailsContentViewController::onCreated()
{
    _createDetailsList();
    _loadListItem();
    listenToSystemInfo([this](MwSignalMgr::SystemInfo info) { _systemInfoChanged(info); });
    setBackKeyHandler([this] { popOut(); });
}

void MwDetailsContentViewController::onPushed(Evas_Object*) { _updateNaviButton(); }

void MwDetailsContentViewController::_createDetailsList()
{
    if (_fileInfo.path.empty()) {
        MW_LOGE("fileInfo == nullptr!!!");
        return;
    }
    _genlist = elm_genlist_add(getEvasObject());
    // Rows are measured at the width of the list, so that long values wrap.
    elm_genlist_mode_set(_genlist, ELM_LIST_COMPRESS);
    elm_genlist_select_mode_set(_genlist, ELM_OBJECT_SELECT_MODE_NONE);
    evas_object_data_set(_genlist, FILE_INFO_KEY, &_fileInfo);
    mwRenewDates(_genlist);
    elm_object_part_content_set(getEvasObject(), LIST_PART, _genlist);
    evas_object_show(_genlist);
}

void MwDetailsContentViewController::_loadListItem()
{
    for (int type = 0; _genlist && type < MwDetailsListItem::TYPE_COUNT; ++type) {
        auto* row = new MwDetailsListItem(type);
        if (!row->append(_genlist))
            delete row;
    }
}

void MwDetailsContentViewController::_updateNaviButton()
{
    const auto clicked
        = [](void* data, Evas_Object*, void*) { static_cast<MwDetailsContentViewController*>(data)->popOut(); };
    mwSetBackButton(getNaviItem(), clicked, this);
}

void MwDetailsContentViewController::_systemInfoChanged(MwSignalMgr::SystemInfo info)
{
    MW_LOGW("BEGIN - system info signal : [%d]", info);
    if (!_genlist) {
        MW_LOGW("genlist is nullptr");
        return;
    }
    if (info == MwSignalMgr::MEDIA_DB_UPDATED)
        return _mediaDBUpdated();
    if (info != MwSignalMgr::TIME_ZONE_CHANGED && info != MwSignalMgr::REGION_FORMAT_CHANGED) {
        MW_LOGW("Not handled signal : [%d]", info);
        return;
    }
    mwRenewDates(_genlist);
    elm_genlist_realized_items_update(_genlist);
}

void MwDetailsContentViewController::_mediaDBUpdated()
{
    if (ecore_file_exists(_fileInfo.path.c_str()))
        return;
    MW_LOGW("file is not exists!!!");
    popOut();
}
