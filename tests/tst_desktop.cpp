// Desktop geometry: TESSEL_MONITORS parsing, stretched screens, sorting, the span index and the
// placement helpers. The window-system screens come from a replaceable screen list here;
// tst_desktop_xvfb asks a real X server with several screens.
#include "zubase/ZuDesktop.h"
#include "zubase/ZuDesktop_p.h"

#include "rklib/RkLogFile.h"

#include <QScreen>
#include <QtTest>

using ZuDesktop::DisplayInfo;
using ZuDesktop::Internal::ScreenGeometry;

namespace {

std::vector<ScreenGeometry> sScreens;
std::vector<ScreenGeometry> fakeScreens()
{
    return sScreens;
}

// "x,y,w,h/ax,ay,aw,ah" plus " P" for primary and " S" for span.
QString describe(const std::vector<DisplayInfo>& inDisplays)
{
    QStringList parts;
    for (const DisplayInfo& d : inDisplays) {
        QString text = QStringLiteral("%1,%2,%3,%4/%5,%6,%7,%8")
                           .arg(d.x)
                           .arg(d.y)
                           .arg(d.w)
                           .arg(d.h)
                           .arg(d.availableX)
                           .arg(d.availableY)
                           .arg(d.availableW)
                           .arg(d.availableH);
        if (d.isPrimary)
            text += QLatin1String(" P");
        if (d.span)
            text += QLatin1String(" S");
        parts << text;
    }
    return parts.join(QLatin1String("; "));
}

ScreenGeometry screen(int inX, int inY, int inW, int inH, int inTaskBar = 0)
{
    return {QRect(inX, inY, inW, inH), QRect(inX, inY, inW, inH - inTaskBar)};
}

} // namespace

Q_DECLARE_METATYPE(std::vector<ScreenGeometry>)

class TestDesktop : public QObject
{
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void environment_data();
    void environment();
    void environmentAppends();
    void windowSystem_data();
    void windowSystem();
    void windowSystemSortsExisting();
    void noScreens();
    void placement();
    void realScreen();
    void debugDump();
};

void TestDesktop::init()
{
    qunsetenv("TESSEL_MONITORS");
    sScreens.clear();
    ZuDesktop::Internal::setScreenSource(&fakeScreens);
}

void TestDesktop::cleanup()
{
    qunsetenv("TESSEL_MONITORS");
    ZuDesktop::Internal::setScreenSource(nullptr);
}

void TestDesktop::environment_data()
{
    QTest::addColumn<QString>("value");
    QTest::addColumn<QString>("expected");

    QTest::newRow("two sizes")
        << "1920x1200,1920x1200"
        << "0,0,1920,1200/0,0,1920,1200 P; 1920,0,1920,1200/1920,0,1920,1200";
    QTest::newRow("negative, then placed after it")
        << "1920x1080-1920+0 1920x1080"
        << "-1920,0,1920,1080/-1920,0,1920,1080 P; 0,0,1920,1080/0,0,1920,1080";
    QTest::newRow("both negative") << "1280x1024-1280-200"
                                   << "-1280,-200,1280,1024/-1280,-200,1280,1024 P";
    QTest::newRow("other sign characters keep the value") << "800x600*5#7"
                                                          << "5,7,800,600/5,7,800,600 P";
    QTest::newRow("not sorted") << "1024x768+1920+0,1920x1080+0+0"
                                << "1920,0,1024,768/1920,0,1024,768 P; 0,0,1920,1080/0,0,1920,1080";
    QTest::newRow("malformed tokens skipped")
        << "abc,,800x600 x600\t\t1024x768+10 garbage"
        << "0,0,800,600/0,0,800,600 P; 800,0,1024,768/800,0,1024,768";
    QTest::newRow("empty") << ""
                           << "";
    QTest::newRow("nothing readable") << "monitors please"
                                      << "";
}

void TestDesktop::environment()
{
    QFETCH(QString, value);
    QFETCH(QString, expected);
    qputenv("TESSEL_MONITORS", value.toLatin1());
    // The window system is not asked while the variable is set, even when it gives nothing.
    sScreens = {screen(0, 0, 3840, 1200)};

    std::vector<DisplayInfo> displays;
    bool fromEnvironment = false;
    const int count = ZuDesktop::getDisplayInfo(displays, &fromEnvironment);
    QCOMPARE(describe(displays), expected);
    QCOMPARE(count, int(displays.size()));
    QCOMPARE(fromEnvironment, !displays.empty());
    QCOMPARE(ZuDesktop::Internal::spanIndex(), -1);
    int x = 1, y = 1, w = 1, h = 1;
    QVERIFY(!ZuDesktop::centerPositionOnSpan(x, y, w, h));
    QCOMPARE(QList<int>({x, y, w, h}), QList<int>({0, 0, 0, 0}));
}

void TestDesktop::environmentAppends()
{
    qputenv("TESSEL_MONITORS", "640x480");
    std::vector<DisplayInfo> displays(1);
    displays[0].x = 100;
    displays[0].w = 300;
    displays[0].span = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), 2);
    // Placed after the entry that was there, not primary; the old span entry is found.
    QCOMPARE(describe({displays[1]}), QStringLiteral("400,0,640,480/400,0,640,480"));
    QCOMPARE(ZuDesktop::Internal::spanIndex(), 0);
}

void TestDesktop::windowSystem_data()
{
    QTest::addColumn<std::vector<ScreenGeometry>>("screens");
    QTest::addColumn<QString>("expected");
    QTest::addColumn<int>("spanIndex");

    QTest::newRow("stretched 3840x1200")
        << std::vector<ScreenGeometry>{screen(0, 0, 3840, 1200, 40)}
        << "0,0,1920,1200/0,0,1920,1160 P S; 1920,0,1920,1200/1920,0,1920,1160 S" << 0;
    QTest::newRow("2560x1080 is not stretched")
        << std::vector<ScreenGeometry>{screen(0, 0, 2560, 1080)} << "0,0,2560,1080/0,0,2560,1080 P"
        << -1;
    QTest::newRow("exactly 2.5 : 1") << std::vector<ScreenGeometry>{screen(0, 0, 2500, 1000)}
                                     << "0,0,1250,1000/0,0,1250,1000 P S; "
                                        "1250,0,1250,1000/1250,0,1250,1000 S"
                                     << 0;
    QTest::newRow("odd width 3841")
        << std::vector<ScreenGeometry>{screen(100, 0, 3841, 1200)}
        << "100,0,1920,1200/100,0,1920,1200 P S; 2020,0,1920,1200/2020,0,1920,1200 S" << 0;
    QTest::newRow("sorted by x then y, span found after sorting")
        << std::vector<ScreenGeometry>{screen(0, 0, 1920, 1200), screen(1920, 0, 3840, 1200),
                                       screen(-1280, 200, 1280, 1024),
                                       screen(-1280, -824, 1280, 1024)}
        << "-1280,-824,1280,1024/-1280,-824,1280,1024; -1280,200,1280,1024/-1280,200,1280,1024; "
           "0,0,1920,1200/0,0,1920,1200 P; 1920,0,1920,1200/1920,0,1920,1200 S; "
           "3840,0,1920,1200/3840,0,1920,1200 S"
        << 3;
    QTest::newRow("leftmost of two stretched screens")
        << std::vector<ScreenGeometry>{screen(0, 0, 3840, 1200), screen(-3840, 0, 3840, 1200)}
        << "-3840,0,1920,1200/-3840,0,1920,1200 S; -1920,0,1920,1200/-1920,0,1920,1200 S; "
           "0,0,1920,1200/0,0,1920,1200 P S; 1920,0,1920,1200/1920,0,1920,1200 S"
        << 0;
}

void TestDesktop::windowSystem()
{
    QFETCH(std::vector<ScreenGeometry>, screens);
    QFETCH(QString, expected);
    QFETCH(int, spanIndex);
    sScreens = screens;
    std::vector<DisplayInfo> displays;
    bool fromEnvironment = true;
    const int count = ZuDesktop::getDisplayInfo(displays, &fromEnvironment);
    QCOMPARE(count, int(displays.size()));
    QCOMPARE(describe(displays), expected);
    QCOMPARE(fromEnvironment, false);
    QCOMPARE(ZuDesktop::Internal::spanIndex(), spanIndex);

    int x = -1, y = -1, w = -1, h = -1;
    QCOMPARE(ZuDesktop::centerPositionOnSpan(x, y, w, h), spanIndex >= 0);
    if (spanIndex >= 0) {
        const DisplayInfo& d = displays[size_t(spanIndex)];
        QCOMPARE(QList<int>({x, y, w, h}), QList<int>({d.w / 2, d.h / 2, d.w, d.h}));
    } else {
        QCOMPARE(QList<int>({x, y, w, h}), QList<int>({0, 0, 0, 0}));
    }
}

void TestDesktop::windowSystemSortsExisting()
{
    sScreens = {screen(0, 0, 1920, 1200)};
    std::vector<DisplayInfo> displays(1);
    displays[0].x = 5000;
    displays[0].w = 100;
    displays[0].h = 100;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), 2);
    QCOMPARE(describe(displays),
             QStringLiteral("0,0,1920,1200/0,0,1920,1200 P; 5000,0,100,100/0,0,0,0"));
}

void TestDesktop::noScreens()
{
    sScreens = {screen(0, 0, 3840, 1200)};
    std::vector<DisplayInfo> displays;
    ZuDesktop::getDisplayInfo(displays, nullptr);
    QCOMPARE(ZuDesktop::Internal::spanIndex(), 0);

    // Nothing reported: nothing appended, nothing else changed.
    sScreens.clear();
    std::vector<DisplayInfo> more(2);
    bool fromEnvironment = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(more, &fromEnvironment), 2);
    QCOMPARE(fromEnvironment, true);
    QCOMPARE(ZuDesktop::Internal::spanIndex(), 0);
    int cx = 7, cy = 7;
    QVERIFY(!ZuDesktop::getRelCenteredDisplayPos(10, 10, 10, 10, cx, cy));
    QCOMPARE(cx, 7);
}

void TestDesktop::placement()
{
    qputenv("TESSEL_MONITORS", "1920x1080-1920+0 1920x1080 1280x1024");
    int cx = -1, cy = -1;
    QVERIFY(ZuDesktop::getRelCenteredDisplayPos(100, 100, 400, 300, cx, cy));
    QCOMPARE(QPoint(cx, cy), QPoint(960, 540));
    QVERIFY(ZuDesktop::getRelCenteredDisplayPos(-1000, 1, 10, 10, cx, cy));
    QCOMPARE(QPoint(cx, cy), QPoint(-960, 540));
    QVERIFY(ZuDesktop::getRelCenteredDisplayPos(3000, 500, 100, 100, cx, cy));
    QCOMPARE(QPoint(cx, cy), QPoint(1920 + 640, 512));

    // Touching an edge, or reaching the last row/column, finds no monitor.
    cx = cy = 42;
    QVERIFY(!ZuDesktop::getRelCenteredDisplayPos(0, 100, 10, 10, cx, cy));
    QVERIFY(!ZuDesktop::getRelCenteredDisplayPos(100, 0, 10, 10, cx, cy));
    QVERIFY(!ZuDesktop::getRelCenteredDisplayPos(100, 100, 1820, 10, cx, cy));
    QVERIFY(!ZuDesktop::getRelCenteredDisplayPos(-100, 100, 200, 10, cx, cy)); // straddles
    QCOMPARE(QPoint(cx, cy), QPoint(42, 42));
}

void TestDesktop::realScreen()
{
    // The offscreen platform's one screen, through QGuiApplication.
    ZuDesktop::Internal::setScreenSource(nullptr);
    QScreen* primary = QGuiApplication::primaryScreen();
    QVERIFY(primary);
    std::vector<DisplayInfo> displays;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), QGuiApplication::screens().size());
    QCOMPARE(displays[0].w, primary->geometry().width());
    QCOMPARE(displays[0].h, primary->geometry().height());
    QVERIFY(displays[0].isPrimary);
}

void TestDesktop::debugDump()
{
    qputenv("TESSEL_MONITORS", "800x600+0+0,800x600");
    RkLogCapture capture;
    std::vector<DisplayInfo> displays;
    ZuDesktop::getDisplayInfo(displays, nullptr);
    QCOMPARE(capture.texts().size(), size_t(0)); // off by default

    ZuDesktop::setDebugDumpEnabled(true);
    std::vector<DisplayInfo> dumped;
    ZuDesktop::getDisplayInfo(dumped, nullptr);
    std::vector<DisplayInfo> again;
    ZuDesktop::getDisplayInfo(again, nullptr); // written once only
    const std::vector<std::string> expected = {
        "\ngetDisplayInfo()\n{",
        "\n  source: TESSEL_MONITORS [800x600+0+0,800x600]",
        "\n  sorted and filtered monitor list:",
        "\n    [x 0  y 0  w 800  h 600  isPrimary 1  span 0]",
        "\n    [x 800  y 0  w 800  h 600  isPrimary 0  span 0]",
        "\n}\n"};
    QCOMPARE(capture.texts(), expected);
}

QTEST_MAIN(TestDesktop)
#include "tst_desktop.moc"
