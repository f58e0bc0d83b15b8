#pragma once

// Internal, Qt-free: the physical state of the mouse buttons (GetKeyState on Windows).

namespace ZuPlatform {

enum : unsigned
{
    kMouseLeft = 1,
    kMouseRight = 2,
    kMouseMiddle = 4
};

// Asks the window system which mouse buttons are held down at this moment, wherever the
// pointer is. inNativeDisplay is the X11 display connection of the application (unused on
// Windows). False, outButtons 0, when the window system could not be asked.
bool inputMouseButtons(void* inNativeDisplay, unsigned& outButtons);

} // namespace ZuPlatform
