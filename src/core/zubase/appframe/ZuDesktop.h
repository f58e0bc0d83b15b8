#pragma once

#include "zubase/zubase_export.h"

#include <vector>

// Monitor geometry for multi-monitor and spanned-monitor workstations. A screen stretched over
// two physical monitors (aspect ratio at least 2.5 : 1) is listed as its two halves; the
// environment variable TESSEL_MONITORS, when set, replaces what the window system reports:
// blank- or comma-separated tokens "WxH+X+Y" (either sign) or "WxH" (placed to the right of the
// previous monitor), e.g. TESSEL_MONITORS="1920x1080-1920+0,1920x1080".
namespace ZuDesktop {

// One monitor in desktop coordinates.
struct ZUBASE_EXPORT DisplayInfo
{
    int x = 0;
    int y = 0;
    int w = 0;
    int h = 0;
    // The area without task bars.
    int availableX = 0;
    int availableY = 0;
    int availableW = 0;
    int availableH = 0;
    // The first monitor appended to the list.
    bool isPrimary = false;
    // Both halves of a stretched screen.
    bool span = false;
};

// Appends the monitors to ioDisplays and returns how many entries it then holds. The window
// system's monitors are sorted (with the entries already there) by x, then y; those from
// TESSEL_MONITORS keep their order. outFromEnvironment (may be null) is set when a monitor is
// read. Also records which entry is the left half of a stretched screen.
ZUBASE_EXPORT int getDisplayInfo(std::vector<DisplayInfo>& ioDisplays, bool* outFromEnvironment);

// Size of the stretched screen's left half and its centre relative to the half's origin
// (outX = w / 2, outY = h / 2); false and all zero when no screen is stretched.
ZUBASE_EXPORT bool centerPositionOnSpan(int& outX, int& outY, int& outW, int& outH);

// Centre of the first monitor that holds the rectangle strictly inside (touching an edge does
// not count); false, outputs unchanged, when none does.
ZUBASE_EXPORT bool getRelCenteredDisplayPos(int inX, int inY, int inW, int inH, int& outCenterX,
                                            int& outCenterY);

// Diagnostics: when switched on, the next getDisplayInfo() writes the list it built to the log
// once (off by default).
ZUBASE_EXPORT void setDebugDumpEnabled(bool inEnabled);

} // namespace ZuDesktop
