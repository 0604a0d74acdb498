#include "Clipboard.h"

#include <X11/Xatom.h>
#include <X11/Xlib.h>

#include <cstdlib>
#include <map>

#include "ShareWays.h"

namespace share {

namespace {

    class Holder {
    public:
        Holder(Display* display, const std::vector<std::string>& paths)
            : _display(display)
            , _window(XCreateSimpleWindow(display, DefaultRootWindow(display), 0, 0, 1, 1, 0, 0, 0))
            , _clipboard(_atom("CLIPBOARD"))
            , _targets(_atom("TARGETS"))
        {
            std::string lines;
            for (const std::string& path : paths)
                lines += (lines.empty() ? "" : "\n") + path;
            for (const char* target : {"UTF8_STRING", "text/plain;charset=utf-8", "text/plain", "STRING"})
                _contents[_atom(target)] = lines;
            const std::string uris = uriListOf(paths);
            _contents[_atom("text/uri-list")] = uris;
            std::string gnome = "copy";
            for (size_t start = 0, end; (end = uris.find("\r\n", start)) != std::string::npos; start = end + 2)
                gnome += "\n" + uris.substr(start, end - start);
            _contents[_atom("x-special/gnome-copied-files")] = gnome;
        }

        int run()
        {
            XSetSelectionOwner(_display, _clipboard, _window, CurrentTime);
            if (XGetSelectionOwner(_display, _clipboard) != _window)
                return EXIT_FAILURE;
            for (;;) {
                XEvent event;
                XNextEvent(_display, &event); // the end of the session ends the process here
                if (event.type == SelectionClear)
                    return EXIT_SUCCESS;
                if (event.type == SelectionRequest)
                    _answer(event.xselectionrequest);
            }
        }

    private:
        Atom _atom(const char* name) { return XInternAtom(_display, name, False); }

        void _answer(const XSelectionRequestEvent& request)
        {
            XEvent reply = {};
            reply.xselection.type = SelectionNotify;
            reply.xselection.requestor = request.requestor;
            reply.xselection.selection = request.selection;
            reply.xselection.target = request.target;
            reply.xselection.time = request.time;
            reply.xselection.property = _give(request) ? request.property : None;
            XSendEvent(_display, request.requestor, False, NoEventMask, &reply);
            XFlush(_display);
        }

        bool _give(const XSelectionRequestEvent& request)
        {
            if (request.property == None)
                return false;
            if (request.target == _targets) {
                std::vector<Atom> all = {_targets};
                for (const auto& entry : _contents)
                    all.push_back(entry.first);
                XChangeProperty(_display, request.requestor, request.property, XA_ATOM, 32, PropModeReplace,
                    reinterpret_cast<const unsigned char*>(all.data()), static_cast<int>(all.size()));
                return true;
            }
            const auto found = _contents.find(request.target);
            if (found == _contents.end())
                return false;
            const std::string& content = found->second;
            XChangeProperty(_display, request.requestor, request.property, request.target, 8, PropModeReplace,
                reinterpret_cast<const unsigned char*>(content.data()), static_cast<int>(content.size()));
            return true;
        }

        Display* _display;
        Window _window;
        Atom _clipboard;
        Atom _targets;
        std::map<Atom, std::string> _contents;
    };

    // Who asked may be gone by now.
    int ignoreError(Display*, XErrorEvent*) { return 0; }

}

int holdClipboard(const std::vector<std::string>& paths)
{
    Display* display = XOpenDisplay(nullptr);
    if (display == nullptr)
        return EXIT_FAILURE;
    XSetErrorHandler(ignoreError);
    const int status = Holder(display, paths).run();
    XCloseDisplay(display);
    return status;
}

}
