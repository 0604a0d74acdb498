// Lets the user choose what to do with recordings that the recorder shares: a small window over what the desktop has.
// Closing it, or Escape, shares nothing.
#include <Elementary.h>

#include <app.h>
#include <panekit/WApp.h>
#include <panekit/WLanguage.h>
#include <panekit/WWindowController.h>
#include <uxt_theme.h>

#include <cstdlib>
#include <cstring>
#include <libintl.h>
#include <memory>

#include "Clipboard.h"
#include "ShareView.h"

namespace {

constexpr auto APP_ID = "com.tovanic.mewlo-share";
constexpr auto TEXT_DOMAIN = "mewlo-lite";
constexpr auto TABLES = "tables/com.tovanic.mewlo-lite_Changeable";
constexpr double BASE_SCALE = 2.6;
constexpr int WIDTH = 640; // design units
constexpr int HEIGHT = 700;

std::string adopt(char* text)
{
    const std::unique_ptr<char, decltype(&std::free)> owner(text, &std::free);
    return text != nullptr ? text : "";
}

class ShareApp : public panekit::WApp {
protected:
    bool onCreate() override
    {
        elm_app_base_scale_set(BASE_SCALE);
        const std::string resources = adopt(app_get_resource_path());
        bindtextdomain(TEXT_DOMAIN, (resources + "locale").c_str());
        bind_textdomain_codeset(TEXT_DOMAIN, "UTF-8");
        textdomain(TEXT_DOMAIN);
        auto window = std::make_unique<panekit::WWindowController>(APP_ID, ELM_WIN_DIALOG_BASIC);
        window->setTitle(panekit::WLanguage::text("IDS_MW_BODY_SHARE"));
        if (!attachWindow(std::move(window)))
            return false;
        elm_theme_extension_add(nullptr, (resources + "edje/MwButton.edj").c_str());
        const std::string tables = adopt(app_get_shared_resource_path()) + TABLES;
        uxt_theme_set_color_table(uxt_theme_add_color_table((tables + "ColorInfo.xml").c_str()));
        uxt_theme_set_font_table(uxt_theme_add_font_table((tables + "FontInfo.xml").c_str()));
        Evas_Object* object = getWindow()->getEvasObject();
        evas_object_resize(object, ELM_SCALE_SIZE(WIDTH), ELM_SCALE_SIZE(HEIGHT));
        _view = std::make_unique<ShareView>(object, resources + "edje/MwShareView.edj");
        return true;
    }

    void onAppControl(app_control_h request, bool) override
    {
        const std::vector<std::string> paths = share::pathsOf(request);
        if (paths.empty()) {
            app_control_reply_to_launch_request(nullptr, request, APP_CONTROL_RESULT_FAILED);
            ui_app_exit();
            return;
        }
        app_control_h kept = nullptr;
        app_control_clone(&kept, request);
        const std::shared_ptr<app_control_s> reply(kept, app_control_destroy);
        _view->show(
            paths,
            [paths, reply](const share::Way& way) {
                _share(way, paths);
                app_control_reply_to_launch_request(nullptr, reply.get(), APP_CONTROL_RESULT_SUCCEEDED);
                ui_app_exit();
            },
            ui_app_exit);
    }

private:
    static void _share(const share::Way& way, const std::vector<std::string>& paths)
    {
        std::vector<std::string> command = way.command;
        if (command.empty()) {
            command = {"/proc/self/exe", share::HOLD_OPTION};
            command.insert(command.end(), paths.begin(), paths.end());
        }
        share::start(command);
    }

    std::unique_ptr<ShareView> _view;
};

}

int main(int argc, char** argv)
{
    if (argc > 2 && std::strcmp(argv[1], share::HOLD_OPTION) == 0)
        return share::holdClipboard({argv + 2, argv + argc});
    app_set_id(APP_ID);
    ShareApp app;
    return app.start(argc, argv);
}
