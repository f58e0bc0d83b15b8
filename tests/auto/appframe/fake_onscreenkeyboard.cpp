// Stands in for the keyboard program: appends its pid to $FAKE_KEYBOARD_LOG; with
// $FAKE_KEYBOARD_WINDOW "normal" or "iconic" it shows a window carrying _NET_WM_PID (iconic:
// marked minimised as a window manager would) and appends "window <pid>". Runs until killed.
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
    if (FILE* file = std::fopen(std::getenv("FAKE_KEYBOARD_LOG"), "a"))
        std::fprintf(file, "%s%d\n", inText, int(getpid())), std::fclose(file);
}

int main()
{
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    alarm(120);
    note("");
    const char* mode = std::getenv("FAKE_KEYBOARD_WINDOW");
    if (Display* display = mode ? XOpenDisplay(nullptr) : nullptr) {
        const Window window =
            XCreateSimpleWindow(display, DefaultRootWindow(display), 0, 0, 99, 99, 0, 0, 0);
        const long pid = getpid(), state[2] = {std::strcmp(mode, "iconic") ? 1L : 3L, 0L};
        const Atom wmState = XInternAtom(display, "WM_STATE", False);
        XChangeProperty(display, window, XInternAtom(display, "_NET_WM_PID", False), XA_CARDINAL,
                        32, PropModeReplace, reinterpret_cast<const unsigned char*>(&pid), 1);
        XChangeProperty(display, window, wmState, wmState, 32, PropModeReplace,
                        reinterpret_cast<const unsigned char*>(state), 2);
        XMapWindow(display, window);
        XSync(display, False);
        note("window ");
    }
    for (;;)
        pause();
}
