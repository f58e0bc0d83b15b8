#include "zubase/ZuDesktop.h"
#include "zubase/appframe/ZuDesktop_p.h"

#include "rklib/RkLogFile.h"

#include <QGuiApplication>
#include <QScreen>

#include <algorithm>
#include <cctype>
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

// Monitor coordinates and sizes beyond this are no monitor; within it, sums of two stay in int.
const long long kMaxCoordinate = 1 << 24;

// Reads tokens the way sscanf reads "%dx%d%c%d%c%d", with 64-bit numbers so that no value is
// cut down silently: %d skips blanks, takes an optional sign and at least one digit, %c any
// character, "x" itself.
class TokenScanner
{
public:
    explicit TokenScanner(const char* inText) : mText(inText) {}

    bool number(long long& outValue)
    {
        while (std::isspace(static_cast<unsigned char>(*mText)))
            ++mText;
        const char* start = mText;
        const bool negative = *mText == '-';
        if (*mText == '-' || *mText == '+')
            ++mText;
        if (!std::isdigit(static_cast<unsigned char>(*mText))) {
            mText = start;
            return false;
        }
        long long value = 0;
        for (; std::isdigit(static_cast<unsigned char>(*mText)); ++mText) {
            // Saturates: anything this long is out of range anyway.
            if (value <= kMaxCoordinate)
                value = value * 10 + (*mText - '0');
        }
        outValue = negative ? -value : value;
        return true;
    }
    bool character(char& outChar)
    {
        if (!*mText)
            return false;
        outChar = *mText++;
        return true;
    }
    bool literal(char inChar)
    {
        if (*mText != inChar)
            return false;
        ++mText;
        return true;
    }

private:
    const char* mText;
};

bool inRange(long long inValue, long long inMinimum)
{
    return inValue >= inMinimum && inValue <= kMaxCoordinate;
}

void appendFromEnvironment(std::vector<ZuDesktop::DisplayInfo>& ioDisplays, const char* inValue,
                           bool* outFromEnvironment)
{
    std::string value(inValue);
    std::replace(value.begin(), value.end(), ',', ' ');
    std::istringstream tokens(value);
    std::string token;
    while (tokens >> token) {
        long long w = 0, h = 0, x = 0, y = 0;
        char signX = 0;
        char signY = 0;
        TokenScanner full(token.c_str());
        TokenScanner sizeOnly(token.c_str());
        if (full.number(w) && full.literal('x') && full.number(h) && full.character(signX) &&
            full.number(x) && full.character(signY) && full.number(y)) {
            if (signX == '-')
                x = -x;
            if (signY == '-')
                y = -y;
        } else if (sizeOnly.number(w) && sizeOnly.literal('x') && sizeOnly.number(h)) {
            x = ioDisplays.empty() ? 0 : (long long)ioDisplays.back().x + ioDisplays.back().w;
            y = 0;
        } else {
            continue;
        }
        // Out of range is skipped like a malformed token: no negative sizes, nothing that
        // would overflow the int geometry.
        if (!inRange(w, 0) || !inRange(h, 0) || !inRange(x, -kMaxCoordinate) ||
            !inRange(y, -kMaxCoordinate))
            continue;
        ZuDesktop::DisplayInfo d;
        d.x = int(x);
        d.y = int(y);
        d.w = int(w);
        d.h = int(h);
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
        if (4 * qint64(width) >= 10 * qint64(height)) {
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
        // In 64 bits: neither the caller's rectangle nor a monitor may overflow the sums.
        if (d.x < inX && d.y < inY && qint64(inX) + inW < qint64(d.x) + d.w &&
            qint64(inY) + inH < qint64(d.y) + d.h) {
            outCenterX = int(d.x + qint64(d.w) / 2);
            outCenterY = int(d.y + qint64(d.h) / 2);
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
