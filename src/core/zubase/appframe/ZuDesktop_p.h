#pragma once

// Internal: the screen list of the window system can be replaced, for tests and for platforms
// whose screens are not reported through QGuiApplication.
#include <QRect>

#include <vector>

namespace ZuDesktop {
namespace Internal {

struct ScreenGeometry
{
    QRect geometry;
    QRect available;
};

// Screens in index order, index 0 being the primary one.
using ScreenSource = std::vector<ScreenGeometry> (*)();

// Null goes back to the window system.
void setScreenSource(ScreenSource inSource);
// The entry of the most recently built list that is the left half of a stretched screen; -1.
int spanIndex();

} // namespace Internal
} // namespace ZuDesktop
