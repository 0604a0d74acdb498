#include "MwSavePopupMenuItem.h"

#include <Elementary.h>

#include <utility>

#include "MwText.h"

namespace {

constexpr auto ROW_STYLE = "mewlo/1line"; // what "default" rows look like here
constexpr auto TEXT_PART = "elm.text.main.left";

}

MwSavePopupMenuItem::MwSavePopupMenuItem(int index, std::function<void(int index)> onChosen)
    : _index(index)
    , _onChosen(std::move(onChosen))
{
}

const char* MwSavePopupMenuItem::getStyle() const { return ROW_STYLE; }

const char* MwSavePopupMenuItem::_getGenlistText(int index)
{
    return index == 0 ? "IDS_MW_OPT_AS_NEW_FILE_ABB" : "IDS_MW_OPT_OVER_ORIGINAL_FILE_ABB";
}

std::string MwSavePopupMenuItem::getText(const char* part)
{
    if (std::string(part) != TEXT_PART)
        return {};
    return mwAdopt(elm_entry_utf8_to_markup(mwTranslate(_getGenlistText(_index)).c_str()));
}

void MwSavePopupMenuItem::onSelected()
{
    // Choosing closes the popup and with it this row.
    if (const auto onChosen = _onChosen; onChosen)
        onChosen(_index);
}
