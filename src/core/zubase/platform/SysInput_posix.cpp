#include "zubase/platform/SysInput.h"

#include <X11/Xlib.h>

#include <cstdlib>
#include <vector>

namespace ZuPlatform {

bool inputMouseButtons(void* inNativeDisplay, unsigned& outButtons)
{
    outButtons = 0;
    auto* display = static_cast<Display*>(inNativeDisplay);
    if (!display)
        return false;
    Window root = 0;
    Window child = 0;
    int rootX = 0, rootY = 0, windowX = 0, windowY = 0;
    unsigned int mask = 0;
    // False only says that the pointer is on another screen than the window asked about; the
    // button mask is valid all the same. The root is set whenever the server answered.
    const bool sameScreen = XQueryPointer(display, DefaultRootWindow(display), &root, &child,
                                          &rootX, &rootY, &windowX, &windowY, &mask);
    if (!sameScreen && root == 0)
        return false;
    if (mask & Button1Mask)
        outButtons |= kMouseLeft;
    if (mask & Button3Mask)
        outButtons |= kMouseRight;
    if (mask & Button2Mask)
        outButtons |= kMouseMiddle;
    return true;
}

} // namespace ZuPlatform

namespace ZuPlatform {

namespace {

// The 32-bit values of a property as the server keeps them (Xlib hands them out as longs).
std::vector<unsigned long> cardinals(Display* inDisplay, Window inWindow, Atom inProperty)
{
    std::vector<unsigned long> values;
    Atom type = 0;
    int format = 0;
    unsigned long count = 0, after = 0;
    unsigned char* data = nullptr;
    if (XGetWindowProperty(inDisplay, inWindow, inProperty, 0, 4096, False, AnyPropertyType, &type,
                           &format, &count, &after, &data) == Success &&
        data && format == 32) {
        const auto* longs = reinterpret_cast<const unsigned long*>(data);
        values.assign(longs, longs + count);
    }
    if (data)
        XFree(data);
    return values;
}

bool windowMinimised(Display* inDisplay, Window inWindow)
{
    constexpr unsigned long kIconicState = 3; // ICCCM WM_STATE
    const std::vector<unsigned long> wmState =
        cardinals(inDisplay, inWindow, XInternAtom(inDisplay, "WM_STATE", False));
    if (!wmState.empty() && wmState[0] == kIconicState)
        return true;
    const Atom hidden = XInternAtom(inDisplay, "_NET_WM_STATE_HIDDEN", False);
    for (unsigned long atom :
         cardinals(inDisplay, inWindow, XInternAtom(inDisplay, "_NET_WM_STATE", False))) {
        if (atom == hidden)
            return true;
    }
    return false;
}

// A window may go away between listing it and reading its properties; Xlib's default handler
// would end the process for that.
int ignoreErrors(Display*, XErrorEvent*)
{
    return 0;
}

std::vector<Window> children(Display* inDisplay, Window inWindow)
{
    Window root = 0, parent = 0;
    Window* list = nullptr;
    unsigned int count = 0;
    std::vector<Window> result;
    if (XQueryTree(inDisplay, inWindow, &root, &parent, &list, &count) && list)
        result.assign(list, list + count);
    if (list)
        XFree(list);
    return result;
}

} // namespace

bool inputProcessWindowMinimised(void* inNativeDisplay, unsigned inProcessId, bool& outMinimised)
{
    outMinimised = false;
    auto* display = static_cast<Display*>(inNativeDisplay);
    if (!display) {
        // Opened once: the check runs on every focus change while the keyboard is up.
        static Display* const own = std::getenv("DISPLAY") ? XOpenDisplay(nullptr) : nullptr;
        display = own;
    }
    if (!display)
        return false;
    const auto previousHandler = XSetErrorHandler(ignoreErrors);
    const Atom pidAtom = XInternAtom(display, "_NET_WM_PID", False);
    const Window root = DefaultRootWindow(display);
    // The window manager's list of client windows where there is one, else the tree.
    std::vector<Window> candidates;
    for (unsigned long client :
         cardinals(display, root, XInternAtom(display, "_NET_CLIENT_LIST", False)))
        candidates.push_back(static_cast<Window>(client));
    if (candidates.empty()) {
        for (Window top : children(display, root)) {
            candidates.push_back(top);
            for (Window inner : children(display, top))
                candidates.push_back(inner);
        }
    }
    for (Window window : candidates) {
        const std::vector<unsigned long> pid = cardinals(display, window, pidAtom);
        if (!pid.empty() && pid[0] == inProcessId && windowMinimised(display, window)) {
            outMinimised = true;
            break;
        }
    }
    XSync(display, False); // errors of our requests reach our handler, not the previous one
    XSetErrorHandler(previousHandler);
    return true;
}

} // namespace ZuPlatform
