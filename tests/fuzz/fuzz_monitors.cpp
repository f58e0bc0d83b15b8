// The TESSEL_MONITORS reader and the placement helpers that use its list. A monitor outside
// the range the reader accepts is a fault of the reader, so the harness stops on it.
#include "zubase/ZuDesktop.h"

#include <climits>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    // The environment holds no NUL: the value ends at the first one.
    const std::string value(reinterpret_cast<const char*>(inData), inSize);
    setenv("TESSEL_MONITORS", value.c_str(), 1);
    std::vector<ZuDesktop::DisplayInfo> displays;
    ZuDesktop::getDisplayInfo(displays, nullptr);
    int x = 0, y = 0, w = 0, h = 0;
    ZuDesktop::centerPositionOnSpan(x, y, w, h);
    const int limit = 1 << 24;
    for (const ZuDesktop::DisplayInfo& d : displays) {
        if (d.w < 0 || d.h < 0 || d.w > limit || d.h > limit || d.x < -limit || d.x > limit ||
            d.y < -limit || d.y > limit)
            std::abort();
        ZuDesktop::getRelCenteredDisplayPos(d.x + 1, d.y + 1, d.w - 2, d.h - 2, x, y);
        ZuDesktop::getRelCenteredDisplayPos(d.x + 1, d.y + 1, INT_MAX, INT_MAX, x, y);
    }
    ZuDesktop::getRelCenteredDisplayPos(INT_MAX, INT_MAX, INT_MAX, INT_MAX, x, y);
    ZuDesktop::getRelCenteredDisplayPos(INT_MIN, INT_MIN, INT_MIN, INT_MIN, x, y);
    return 0;
}
