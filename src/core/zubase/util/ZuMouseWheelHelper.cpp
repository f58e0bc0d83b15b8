#include "zubase/ZuMouseWheelHelper.h"

#include <cstdlib>

ZuMouseWheelHelper::ZuMouseWheelHelper() : mDelta(0) {}

int ZuMouseWheelHelper::calcMouseWheelStepsFor120Ticks(int inDelta)
{
    // Summed wide: the remainder is below 120, but a delta near the int limit must not
    // overflow on the way.
    const long long sum = static_cast<long long>(mDelta) + inDelta;
    if (std::llabs(sum) < 120) {
        mDelta = static_cast<int>(sum);
        return 0;
    }
    const long long steps = sum / 120;
    mDelta = static_cast<int>(sum - steps * 120);
    return static_cast<int>(steps);
}
