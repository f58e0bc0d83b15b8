// A host built outside the tree that uses only application-frame classes: nothing of rklib
// is referenced by the host itself, so the linker drops it, and libzubase must find it alone.
#include <zubase/ZuApplication.h>
#include <zubase/ZuDesktop.h>

#include <cstdio>
#include <vector>

int main(int argc, char** argv, char** envp)
{
    ZuApplication* app = ZuApplication::createInstance(argc, argv, envp);
    std::vector<ZuDesktop::DisplayInfo> displays;
    const int count = ZuDesktop::getDisplayInfo(displays, nullptr);
    std::printf("application %s, %d display(s)\n",
                app && ZuApplication::isMainThread() ? "ok" : "missing", count);
    delete app;
    return count > 0 ? 0 : 1;
}
