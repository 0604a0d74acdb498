#include "MwMemoryFullPopup.h"

#include <app_control.h>

#include <panekit/WPopupController.h>

#include "MwHandle.h"
#include "MwLog.h"
#include "MwModel.h"

using panekit::WPopupController;

namespace {

constexpr auto STORAGE_SETTINGS = "com.tovanic.setting.storage";

void openStorageSettings()
{
    MwHandle<app_control_h, app_control_destroy> request;
    int error = app_control_create(request.out());
    if (error != APP_CONTROL_ERROR_NONE) {
        MW_LOGE("app_control_create failed:[%d]", error);
        return;
    }
    app_control_set_app_id(request.get(), STORAGE_SETTINGS);
    app_control_add_extra_data(request.get(), "viewtype", "storage_detail");
    app_control_set_launch_mode(request.get(), APP_CONTROL_LAUNCH_MODE_GROUP);
    error = app_control_send_launch_request(request.get(), nullptr, nullptr);
    if (error != APP_CONTROL_ERROR_NONE)
        MW_LOGE("app_control_send_launch_request failed:[%d]", error);
}

}

WPopupController* mwCreateMemoryFullPopup(Evas_Object* window, int storage)
{
    auto* popup = new WPopupController();
    popup->setTitle("IDS_IDLE_HEADER_NOT_ENOUGH_SPACE_ABB2");
    popup->setContent(storage == MW_STORAGE_CARD ? "IDS_IDLE_POP_YOUR_SD_CARD_DOESNT_HAVE_ENOUGH_SPACE_MSG"
                                                 : "IDS_IDLE_POP_YOUR_DEVICE_STORAGE_DOESNT_HAVE_ENOUGH_SPACE_MSG");
    popup->addButton("IDS_MW_BUTTON_CANCEL", [](WPopupController* self) { self->destroy(); });
    popup->addButton("IDS_MW_OPT_SETTINGS", [](WPopupController* self) {
        openStorageSettings();
        self->destroy();
    });
    popup->create(window);
    return popup;
}
