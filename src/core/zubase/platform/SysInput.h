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

// Whether a top-level window of process inProcessId is minimised (EnumWindows,
// GetWindowThreadProcessId and IsIconic on Windows). On X11 the windows are those whose
// _NET_WM_PID is the id, taken from the window manager's _NET_CLIENT_LIST, else from the
// root's children and theirs (a window manager reparents them); minimised means iconic in
// WM_STATE or hidden in _NET_WM_STATE.
// inNativeDisplay null: a connection of our own to $DISPLAY, opened on first use and kept.
// False, with outMinimised false, when no X server can be asked.
bool inputProcessWindowMinimised(void* inNativeDisplay, unsigned inProcessId, bool& outMinimised);

} // namespace ZuPlatform
