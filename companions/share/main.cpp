// Lets the user choose what to do with recordings that the recorder shares: a small window over what the desktop has.
// Closing it, or Escape, shares nothing.
#include <app.h>
#include <panekit/WWindowController.h>

#include <cstring>
#include <memory>

#include "Clipboard.h"
#include "CompanionWindow.h"
#include "ShareView.h"

namespace {

constexpr int WIDTH = 640; // design units
constexpr int HEIGHT = 700;

class ShareApp : public CompanionWindow {
public:
    ShareApp()
        : CompanionWindow("com.tovanic.mewlo-share", "IDS_MW_BODY_SHARE", WIDTH, HEIGHT)
    {
    }

protected:
    bool onCreate() override
    {
        if (!CompanionWindow::onCreate())
            return false;
        _view = std::make_unique<ShareView>(getWindow()->getEvasObject(), resources() + "edje/MwShareView.edj");
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
    ShareApp app;
    return app.start(argc, argv);
}
