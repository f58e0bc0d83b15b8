// Desktop geometry: TESSEL_MONITORS, stretched screens, sorting and the placement helpers. The
// window system's screens come from a replaceable list here; tst_appframe_xvfb asks a real X
// server with several screens.
#include "zubase/ZuDesktop.h"
#include "zubase/appframe/ZuDesktop_p.h"

#include "TestSupport.h"

#include <climits>

using ZuDesktop::DisplayInfo;
using Screens = std::vector<ZuDesktop::Internal::ScreenGeometry>;
Q_DECLARE_METATYPE(Screens)

namespace {

Screens sScreens;

// "x,y,wxh", then "/x,y,wxh" of the available area where it differs, " P" primary, " S" span.
QString describe(const std::vector<DisplayInfo>& inDisplays)
{
    auto text = [](int inX, int inY, int inW, int inH) {
        return QStringLiteral("%1,%2,%3x%4").arg(inX).arg(inY).arg(inW).arg(inH);
    };
    QStringList parts;
    for (const DisplayInfo& d : inDisplays) {
        const QString all = text(d.x, d.y, d.w, d.h);
        const QString available = text(d.availableX, d.availableY, d.availableW, d.availableH);
        parts << all + (all == available ? "" : "/" + available) + (d.isPrimary ? " P" : "") +
                     (d.span ? " S" : "");
    }
    return parts.join(QLatin1String("; "));
}

ZuDesktop::Internal::ScreenGeometry screen(int inX, int inY, int inW, int inH, int inTaskBar = 0)
{
    return {QRect(inX, inY, inW, inH), QRect(inX, inY, inW, inH - inTaskBar)};
}

} // namespace

class TestDesktop : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void init()
    {
        qunsetenv("TESSEL_MONITORS");
        ZuDesktop::Internal::setScreenSource([] { return sScreens; });
    }
    void getDisplayInfo_data();
    void getDisplayInfo();
    void appendsToExisting();
    void placement();
    void debugDump();
};

void TestDesktop::getDisplayInfo_data()
{
    // With TESSEL_MONITORS set the window system is not asked, even when the value gives nothing.
    QTest::addColumn<QByteArray>("monitors"); // null: not set
    QTest::addColumn<Screens>("screens");
    QTest::addColumn<QString>("expected");
    QTest::addColumn<QSize>("span"); // of the left half; empty: none
    const Screens wide = {screen(0, 0, 3840, 1200)};

    QTest::newRow("env: negative, then placed after it")
        << QByteArray("1920x1080-1920+0,1920x1080") << wide << "-1920,0,1920x1080 P; 0,0,1920x1080"
        << QSize();
    QTest::newRow("env: other signs, double minus, not sorted")
        << QByteArray("1280x1024--1280-200 800x600*5#7") << wide
        << "1280,-200,1280x1024 P; 5,7,800x600" << QSize();
    QTest::newRow("env: malformed tokens skipped")
        << QByteArray("abc,,800x600 x600\t\t1024x768+10 garbage") << wide
        << "0,0,800x600 P; 800,0,1024x768" << QSize();
    QTest::newRow("env: empty") << QByteArray("") << wide << "" << QSize();
    // Values beyond the int geometry, or negative sizes, are skipped like malformed tokens.
    QTest::newRow("env: out of range")
        << QByteArray("4x0-2147483648?0 4294969216x1080+4294967306+0 2147483647x0+8+7 "
                      "-1920x1080 47x0,2147483640x6,0x0")
        << wide << "0,0,47x0 P; 47,0,0x0" << QSize();
    QTest::newRow("env: placed beyond the range")
        << QByteArray("16777216x10+0+0 16777216x10 1x1") << wide
        << "0,0,16777216x10 P; 16777216,0,16777216x10" << QSize();
    // A screen of at least 2.5 : 1 is two monitors side by side.
    QTest::newRow("stretched 3840x1200, 2560x1080 not")
        << QByteArray() << Screens{screen(0, 0, 3840, 1200, 40), screen(3840, 0, 2560, 1080)}
        << "0,0,1920x1200/0,0,1920x1160 P S; 1920,0,1920x1200/1920,0,1920x1160 S; "
           "3840,0,2560x1080"
        << QSize(1920, 1200);
    QTest::newRow("sorted by x then y, exactly 2.5 : 1, odd width")
        << QByteArray()
        << Screens{screen(0, 0, 1920, 1200), screen(1920, 0, 3841, 1200),
                   screen(-1280, 200, 1280, 1024), screen(-1280, -824, 2560, 1024)}
        << "-1280,-824,1280x1024 S; -1280,200,1280x1024; 0,-824,1280x1024 S; 0,0,1920x1200 P; "
           "1920,0,1920x1200 S; 3840,0,1920x1200 S"
        << QSize(1280, 1024);
}

void TestDesktop::getDisplayInfo()
{
    QFETCH(QByteArray, monitors);
    QFETCH(Screens, screens);
    QFETCH(QString, expected);
    QFETCH(QSize, span);
    if (!monitors.isNull())
        qputenv("TESSEL_MONITORS", monitors);
    sScreens = screens;
    std::vector<DisplayInfo> displays;
    bool fromEnvironment = monitors.isNull();
    const int count = ZuDesktop::getDisplayInfo(displays, &fromEnvironment);
    QCOMPARE(count, int(displays.size()));
    QCOMPARE(describe(displays), expected);
    // Untouched when nothing was found.
    QCOMPARE(fromEnvironment, displays.empty() ? monitors.isNull() : !monitors.isNull());

    int x = -1, y = -1, w = -1, h = -1;
    QCOMPARE(ZuDesktop::centerPositionOnSpan(x, y, w, h), !span.isEmpty());
    const QSize size = span.isValid() ? span : QSize(0, 0);
    QCOMPARE(QList<int>({x, y, w, h}),
             QList<int>({size.width() / 2, size.height() / 2, size.width(), size.height()}));
}

void TestDesktop::appendsToExisting()
{
    // From the environment: placed after the entry that was there, not primary.
    qputenv("TESSEL_MONITORS", "640x480");
    std::vector<DisplayInfo> displays(1);
    displays[0].x = 100;
    displays[0].w = 300;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), 2);
    QCOMPARE(describe({displays[1]}), QStringLiteral("400,0,640x480"));
    // From the window system: sorted together with the entry that was there.
    qunsetenv("TESSEL_MONITORS");
    sScreens = {screen(0, 0, 1920, 1200)};
    displays.assign(1, DisplayInfo());
    displays[0].x = 5000;
    displays[0].w = displays[0].h = 100;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), 2);
    QCOMPARE(describe(displays), QStringLiteral("0,0,1920x1200 P; 5000,0,100x100/0,0,0x0"));
}

void TestDesktop::placement()
{
    // The centre of the first monitor that holds the rectangle (x, y, w, h) strictly inside:
    // touching an edge, reaching the last row or column, straddling or a size that would wrap
    // around the int range finds none and leaves the outputs alone.
    qputenv("TESSEL_MONITORS", "1920x1080-1920+0 1920x1080 1280x1024");
    const QList<std::tuple<int, int, int, int, QPoint>> cases = {
        {100, 100, 400, 300, QPoint(960, 540)},   {-1000, 1, 10, 10, QPoint(-960, 540)},
        {3000, 500, 100, 100, QPoint(2560, 512)}, {0, 100, 10, 10, QPoint(42, 42)},
        {100, 0, 10, 10, QPoint(42, 42)},         {100, 100, 1820, 10, QPoint(42, 42)},
        {100, 100, 10, 980, QPoint(42, 42)},      {-100, 100, 200, 10, QPoint(42, 42)},
        {100, 100, INT_MAX, 10, QPoint(42, 42)},  {100, 100, 10, INT_MAX, QPoint(42, 42)}};
    for (const auto& [x, y, w, h, centre] : cases) {
        QPoint found(42, 42);
        QCOMPARE(ZuDesktop::getRelCenteredDisplayPos(x, y, w, h, found.rx(), found.ry()),
                 centre != QPoint(42, 42));
        QCOMPARE(found, centre);
    }
}

void TestDesktop::debugDump()
{
    // Off by default; once switched on, the next list built is written once.
    qputenv("TESSEL_MONITORS", "800x600+0+0,800x600");
    RkLogCapture capture;
    std::vector<DisplayInfo> displays;
    ZuDesktop::getDisplayInfo(displays, nullptr);
    ZuDesktop::setDebugDumpEnabled(true);
    for (int i = 0; i < 2; ++i)
        ZuDesktop::getDisplayInfo(displays = {}, nullptr);
    std::string all;
    for (const std::string& text : capture.texts())
        all += text;
    QCOMPARE(QString::fromStdString(all),
             "\ngetDisplayInfo()\n{\n  source: TESSEL_MONITORS [800x600+0+0,800x600]"
             "\n  sorted and filtered monitor list:"
             "\n    [x 0  y 0  w 800  h 600  isPrimary 1  span 0]"
             "\n    [x 800  y 0  w 800  h 600  isPrimary 0  span 0]\n}\n");
}

QTEST_MAIN(TestDesktop)
#include "tst_desktop.moc"
