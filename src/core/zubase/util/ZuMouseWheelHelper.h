#pragma once

#include "zubase/zubase_export.h"

// Turns wheel deltas into whole steps of 120 (one notch of a classic wheel). High-resolution
// wheels send smaller deltas; they add up until a full step is reached, and the remainder,
// with its sign, is kept for the next call. A plain copyable value.
class ZUBASE_EXPORT ZuMouseWheelHelper
{
public:
    ZuMouseWheelHelper();

    // Adds inDelta (e.g. QWheelEvent::angleDelta().y()) and returns the whole steps it
    // completes: positive up, negative down, 0 while less than 120 has added up.
    int calcMouseWheelStepsFor120Ticks(int inDelta);

private:
    int mDelta;
};
