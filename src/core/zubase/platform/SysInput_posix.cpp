#include "zubase/platform/SysInput.h"

#include <X11/Xlib.h>

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
