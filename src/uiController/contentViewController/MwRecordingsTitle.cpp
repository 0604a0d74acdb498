#include "MwRecordingsTitle.h"

#include <libintl.h>
#include <utility>

#include <Elementary.h>

#include "MwContentViewController.h"
#include "MwNaviButtons.h"
#include "MwRecordingsMode.h"

namespace {

constexpr auto BACK_PART = "prev_btn";
constexpr auto LEFT_PART = "title_left_btn";
constexpr auto RIGHT_PART = "title_right_btn";
constexpr auto MORE_PART = "title_more_btn";
constexpr auto NORMAL_TITLE = "IDS_MW_HEADER_RECORDINGS_M_VOICE_ABB";

}

MwRecordingsTitle::MwRecordingsTitle(MwContentViewController& screen, Actions actions)
    : _screen(screen)
    , _actions(std::move(actions))
{
}

void MwRecordingsTitle::_loadTitle(const MwRecordingsMode& mode, bool isEmpty, size_t count)
{
    if (!_screen.getNaviItem())
        return;
    const char* titleId = mode.picks && isEmpty ? NORMAL_TITLE : mode.titleId;
    if (!titleId && count == 0)
        titleId = "IDS_MW_HEADER_SELECT_RECORDINGS_ABB2";
    if (titleId)
        return _screen.setTitle(titleId);
    _screen.setCountTitle(count);
}

void MwRecordingsTitle::_loadTitleButtons(const MwRecordingsMode& mode, bool isEmpty)
{
    if (!_screen.getNaviItem())
        return;
    const auto back = [](void* data, Evas_Object*, void*) { static_cast<MwRecordingsTitle*>(data)->_actions.back(); };
    const auto done = [](void* data, Evas_Object*, void*) { static_cast<MwRecordingsTitle*>(data)->_actions.done(); };
    const bool hasDone = mode.buttons == MwRecordingsMode::Buttons::CANCEL_AND_DONE && !(mode.picks && isEmpty);
    _setTitleButton(BACK_PART, hasDone ? nullptr : "naviframe/back_btn/default", nullptr, back);
    _setTitleButton(LEFT_PART, hasDone ? "naviframe/title_left" : nullptr, "IDS_TPLATFORM_ACBUTTON_CANCEL_ABB", back);
    _setTitleButton(RIGHT_PART, hasDone ? "naviframe/title_right" : nullptr, mode.doneTextId, done);
}

// style: null takes the button away. One that is there already stays: it may be the one that is being clicked.
void MwRecordingsTitle::_setTitleButton(const char* part, const char* style, const char* textId, Clicked clicked)
{
    Evas_Object* item = _screen.getNaviItem();
    if (!style)
        return mwRemoveNaviButton(item, part);
    Evas_Object* button = elm_object_item_part_content_get(item, part);
    if (button && textId)
        elm_object_domain_translatable_part_text_set(button, nullptr, textdomain(nullptr), textId);
    else if (!button && textId)
        mwSetTitleButton(item, part, style, textId, clicked, this);
    else if (!button)
        mwSetBackButton(item, clicked, this);
}

void MwRecordingsTitle::_loadMoreButton(bool hasMenu)
{
    Evas_Object* item = _screen.getNaviItem();
    if (!item)
        return;
    Evas_Object* button = elm_object_item_part_content_get(item, MORE_PART);
    if (hasMenu && !button)
        _screen.setMoreButton(_actions.more);
    else if (!hasMenu && button)
        evas_object_del(elm_object_item_part_content_unset(item, MORE_PART));
}

void MwRecordingsTitle::_enableDoneButton(bool isPossible)
{
    if (Evas_Object* done = elm_object_item_part_content_get(_screen.getNaviItem(), RIGHT_PART); done)
        elm_object_disabled_set(done, !isPossible);
}
