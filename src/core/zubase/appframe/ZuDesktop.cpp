#include "zubase/ZuDesktop.h"
#include "zubase/appframe/ZuDesktop_p.h"

#include "rklib/RkLogFile.h"

#include <QGuiApplication>
#include <QScreen>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <string>

namespace {

int sSpanIndex = -1;
ZuDesktop::Internal::ScreenSource sScreenSource = nullptr;
// Set when the dump is wanted; the next list built is written once.
bool sDebugDumpDone = true;

std::vector<ZuDesktop::Internal::ScreenGeometry> windowSystemScreens()
{
    std::vector<ZuDesktop::Internal::ScreenGeometry> screens;
    if (!qobject_cast<QGuiApplication*>(QCoreApplication::instance()))
        return screens;
    // QGuiApplication lists the primary screen first.
    for (QScreen* screen : QGuiApplication::screens())
        screens.push_back({screen->geometry(), screen->availableGeometry()});
    return screens;
}

void appendFromEnvironment(std::vector<ZuDesktop::DisplayInfo>& ioDisplays, const char* inValue,
                           bool* outFromEnvironment)
{
    std::string value(inValue);
    std::replace(value.begin(), value.end(), ',', ' ');
    std::istringstream tokens(value);
    std::string token;
    while (tokens >> token) {
        ZuDesktop::DisplayInfo d;
        char signX = 0;
        char signY = 0;
        if (std::sscanf(token.c_str(), "%dx%d%c%d%c%d", &d.w, &d.h, &signX, &d.x, &signY, &d.y) ==
            6) {
            if (signX == '-')
                d.x = -d.x;
            if (signY == '-')
                d.y = -d.y;
        } else if (std::sscanf(token.c_str(), "%dx%d", &d.w, &d.h) == 2) {
            d.x = ioDisplays.empty() ? 0 : ioDisplays.back().x + ioDisplays.back().w;
            d.y = 0;
        } else {
            continue;
        }
        d.availableX = d.x;
        d.availableY = d.y;
        d.availableW = d.w;
        d.availableH = d.h;
        d.isPrimary = ioDisplays.empty();
        d.span = false;
        ioDisplays.push_back(d);
        if (outFromEnvironment)
            *outFromEnvironment = true;
    }
}

void appendFromScreens(std::vector<ZuDesktop::DisplayInfo>& ioDisplays,
                       const std::vector<ZuDesktop::Internal::ScreenGeometry>& inScreens,
                       bool* outFromEnvironment)
{
    for (size_t i = 0; i < inScreens.size(); ++i) {
        const QRect& g = inScreens[i].geometry;
        const QRect& a = inScreens[i].available;
        const int width = g.right() - g.left() + 1;
        const int height = g.bottom() - g.top() + 1;
        const int availableWidth = a.right() - a.left() + 1;
        const int availableHeight = a.bottom() - a.top() + 1;

        ZuDesktop::DisplayInfo d;
        d.x = g.left();
        d.y = g.top();
        d.w = width;
        d.h = height;
        d.availableX = a.left();
        d.availableY = a.top();
        d.availableW = availableWidth;
        d.availableH = availableHeight;
        d.isPrimary = i == 0;
        // One output stretched over two monitors: at least 2.5 : 1.
        if (4 * width >= 10 * height) {
            d.span = true;
            d.w = width / 2;
            d.availableW = availableWidth / 2;
            ioDisplays.push_back(d);
            d.x = g.left() + width / 2;
            d.availableX = a.left() + availableWidth / 2;
            d.isPrimary = false;
        }
        ioDisplays.push_back(d);
        if (outFromEnvironment)
            *outFromEnvironment = false;
    }
}

void dump(const std::vector<ZuDesktop::DisplayInfo>& inDisplays, const char* inEnvironment)
{
    RkLogFile& log = getTheLogInstance();
    log.printf("\ngetDisplayInfo()\n{");
    if (inEnvironment)
        log.printf("\n  source: TESSEL_MONITORS [%s]", inEnvironment);
    log.printf("\n  sorted and filtered monitor list:");
    for (const ZuDesktop::DisplayInfo& d : inDisplays)
        log.printf("\n    [x %d  y %d  w %d  h %d  isPrimary %d  span %d]", d.x, d.y, d.w, d.h,
                   int(d.isPrimary), int(d.span));
    log.printf("\n}\n");
}

} // namespace

namespace ZuDesktop {

int getDisplayInfo(std::vector<DisplayInfo>& ioDisplays, bool* outFromEnvironment)
{
    const char* environment = std::getenv("TESSEL_MONITORS");
    if (environment) {
        appendFromEnvironment(ioDisplays, environment, outFromEnvironment);
    } else {
        const std::vector<Internal::ScreenGeometry> screens =
            sScreenSource ? sScreenSource() : windowSystemScreens();
        if (screens.empty())
            return int(ioDisplays.size());
        appendFromScreens(ioDisplays, screens, outFromEnvironment);
        std::stable_sort(ioDisplays.begin(), ioDisplays.end(),
                         [](const DisplayInfo& inA, const DisplayInfo& inB) {
                             return inA.x != inB.x ? inA.x < inB.x : inA.y < inB.y;
                         });
    }

    sSpanIndex = -1;
    for (size_t i = 0; i < ioDisplays.size(); ++i) {
        if (ioDisplays[i].span &&
            (sSpanIndex < 0 || ioDisplays[i].x < ioDisplays[size_t(sSpanIndex)].x))
            sSpanIndex = int(i);
    }

    if (!sDebugDumpDone) {
        sDebugDumpDone = true;
        dump(ioDisplays, environment);
    }
    return int(ioDisplays.size());
}

bool centerPositionOnSpan(int& outX, int& outY, int& outW, int& outH)
{
    std::vector<DisplayInfo> displays;
    getDisplayInfo(displays, nullptr);
    outX = outY = outW = outH = 0;
    if (sSpanIndex < 0 || sSpanIndex >= int(displays.size()))
        return false;
    const DisplayInfo& d = displays[size_t(sSpanIndex)];
    outX = d.w / 2;
    outY = d.h / 2;
    outW = d.w;
    outH = d.h;
    return true;
}

bool getRelCenteredDisplayPos(int inX, int inY, int inW, int inH, int& outCenterX, int& outCenterY)
{
    std::vector<DisplayInfo> displays;
    getDisplayInfo(displays, nullptr);
    for (const DisplayInfo& d : displays) {
        if (d.x < inX && d.y < inY && inX + inW < d.x + d.w && inY + inH < d.y + d.h) {
            outCenterX = d.x + d.w / 2;
            outCenterY = d.y + d.h / 2;
            return true;
        }
    }
    return false;
}

void setDebugDumpEnabled(bool inEnabled)
{
    sDebugDumpDone = !inEnabled;
}

namespace Internal {

void setScreenSource(ScreenSource inSource)
{
    sScreenSource = inSource;
}

int spanIndex()
{
    return sSpanIndex;
}

} // namespace Internal
} // namespace ZuDesktop
