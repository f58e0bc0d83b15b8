// Stands in for the on-screen keyboard program. Appends its pid to $FAKE_KEYBOARD_LOG when it
// starts; with $FAKE_KEYBOARD_WINDOW "normal" or "iconic" it also shows a window carrying
// _NET_WM_PID (iconic: marked minimised as a window manager would) and then appends
// "window <pid>". Runs until killed, at most two minutes, and dies with its parent.
#include <X11/Xatom.h>
#include <X11/Xlib.h>

#include <sys/prctl.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <unistd.h>

static void note(const char* inText)
{
    if (const char* path = std::getenv("FAKE_KEYBOARD_LOG")) {
        if (FILE* file = std::fopen(path, "a")) {
            std::fprintf(file, "%s%d\n", inText, static_cast<int>(getpid()));
            std::fclose(file);
        }
    }
}

int main()
{
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    alarm(120);
    note("");
    const char* mode = std::getenv("FAKE_KEYBOARD_WINDOW");
    Display* display = mode ? XOpenDisplay(nullptr) : nullptr;
    if (display) {
        const Window window =
            XCreateSimpleWindow(display, DefaultRootWindow(display), 0, 0, 200, 100, 0, 0, 0);
        const long pid = getpid();
        XChangeProperty(display, window, XInternAtom(display, "_NET_WM_PID", False), XA_CARDINAL,
                        32, PropModeReplace, reinterpret_cast<const unsigned char*>(&pid), 1);
        const Atom wmState = XInternAtom(display, "WM_STATE", False);
        const long state[2] = {std::strcmp(mode, "iconic") == 0 ? 3L : 1L, 0L};
        XChangeProperty(display, window, wmState, wmState, 32, PropModeReplace,
                        reinterpret_cast<const unsigned char*>(state), 2);
        XMapWindow(display, window);
        XSync(display, False);
        note("window ");
    }
    for (;;)
        pause();
}
