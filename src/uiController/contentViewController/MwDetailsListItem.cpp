#include "MwDetailsListItem.h"

#include <Ecore_File.h>
#include <Elementary.h>

#include <array>
#include <string_view>

#include "MwDetailsTexts.h"
#include "MwDisplayText.h"
#include "MwListDates.h"
#include "MwLog.h"
#include "MwModel.h"
#include "MwText.h"

namespace {

constexpr auto ROW_STYLE = "multiline_sub.main";
constexpr std::string_view TITLE_PART = "elm.text.main";
constexpr std::string_view VALUE_PART = "elm.text.multiline";
constexpr std::array<const char*, MwDetailsListItem::TYPE_COUNT> TITLES
    = {"IDS_MW_HEADER_FILE_NAME", "IDS_ST_BODY_DATE", "IDS_MF_BODY_PATH", "IDS_MW_BODY_LENGTH", "IDS_MUSIC_BODY_SIZE"};

const MwFileInfo* fileInfoOf(Evas_Object* genlist)
{
    const auto* info = static_cast<const MwFileInfo*>(evas_object_data_get(genlist, "file_info"));
    if (!info)
        MW_LOGE("fileInfo == nullptr!!!");
    return info;
}

}

MwDetailsListItem::MwDetailsListItem(int type)
    : _type(type)
{
}

const char* MwDetailsListItem::getStyle() const { return ROW_STYLE; }

std::string MwDetailsListItem::getText(const char* part)
{
    if (part == TITLE_PART)
        return mwDisplayMarkup(_getTitle());
    if (part == VALUE_PART)
        return mwDisplayMarkup(_getValue());
    return {};
}

std::string MwDetailsListItem::_getTitle() const
{
    if (_type >= 0 && _type < TYPE_COUNT)
        return mwTranslate(TITLES[static_cast<size_t>(_type)]);
    MW_LOGE("invalid item [%d]", _type);
    return "please add text";
}

std::string MwDetailsListItem::_getValue() const
{
    const MwFileInfo* info = fileInfoOf(getGenlist());
    if (!info)
        return {};
    switch (_type) {
    case NAME:
        return info->displayName;
    case DATE:
        return _getDateText();
    case LOCATION:
        return _getLoactionText();
    case LENGTH:
        return mwLengthText(info->duration);
    case SIZE:
        return _getFileSizeText();
    }
    return {};
}

std::string MwDetailsListItem::_getDateText() const
{
    return mwDateText(getGenlist(), fileInfoOf(getGenlist())->modifiedTime, MwICU::DATE_AND_TIME);
}

std::string MwDetailsListItem::_getLoactionText() const { return mwLocationText(fileInfoOf(getGenlist())->path); }

std::string MwDetailsListItem::_getFileSizeText() const
{
    return mwSizeText(static_cast<double>(ecore_file_size(fileInfoOf(getGenlist())->path.c_str())));
}
