// Desktop geometry: TESSEL_MONITORS parsing, stretched screens, sorting, the span index and the
// placement helpers. The window-system screens come from a replaceable screen list here;
// tst_appframe_xvfb asks a real X server with several screens.
#include "zubase/ZuDesktop.h"
#include "zubase/appframe/ZuDesktop_p.h"

#include "rklib/RkLogFile.h"

#include <QtTest>

using ZuDesktop::DisplayInfo;
using ZuDesktop::Internal::ScreenGeometry;
using Screens = std::vector<ScreenGeometry>;

namespace {

Screens sScreens;
Screens fakeScreens()
{
    return sScreens;
}

// "x,y,wxh", then "/ax,ay,awxah" when the available area differs, " P" primary, " S" span.
QString describe(const std::vector<DisplayInfo>& inDisplays)
{
    QStringList parts;
    for (const DisplayInfo& d : inDisplays) {
        QString text = QStringLiteral("%1,%2,%3x%4").arg(d.x).arg(d.y).arg(d.w).arg(d.h);
        if (QRect(d.x, d.y, d.w, d.h) !=
            QRect(d.availableX, d.availableY, d.availableW, d.availableH))
            text += QStringLiteral("/%1,%2,%3x%4")
                        .arg(d.availableX)
                        .arg(d.availableY)
                        .arg(d.availableW)
                        .arg(d.availableH);
        parts << text + (d.isPrimary ? " P" : "") + (d.span ? " S" : "");
    }
    return parts.join(QLatin1String("; "));
}

ScreenGeometry screen(int inX, int inY, int inW, int inH, int inTaskBar = 0)
{
    return {QRect(inX, inY, inW, inH), QRect(inX, inY, inW, inH - inTaskBar)};
}

} // namespace

Q_DECLARE_METATYPE(Screens)

class TestDesktop : public QObject
{
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void getDisplayInfo_data();
    void getDisplayInfo();
    void appendsToExisting();
    void placement();
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

void TestDesktop::getDisplayInfo_data()
{
    // With TESSEL_MONITORS set the window system is not asked, even when the value gives nothing.
    QTest::addColumn<QByteArray>("monitors"); // null: not set
    QTest::addColumn<Screens>("screens");
    QTest::addColumn<QString>("expected");
    QTest::addColumn<int>("spanIndex");
    const Screens wide = {screen(0, 0, 3840, 1200)};

    QTest::newRow("env: two sizes")
        << QByteArray("1920x1200,1920x1200") << wide << "0,0,1920x1200 P; 1920,0,1920x1200" << -1;
    QTest::newRow("env: negative, then placed after it")
        << QByteArray("1920x1080-1920+0 1920x1080") << wide << "-1920,0,1920x1080 P; 0,0,1920x1080"
        << -1;
    QTest::newRow("env: both negative")
        << QByteArray("1280x1024-1280-200") << wide << "-1280,-200,1280x1024 P" << -1;
    QTest::newRow("env: other sign characters keep the value")
        << QByteArray("800x600*5#7") << wide << "5,7,800x600 P" << -1;
    QTest::newRow("env: not sorted") << QByteArray("1024x768+1920+0,1920x1080+0+0") << wide
                                     << "1920,0,1024x768 P; 0,0,1920x1080" << -1;
    QTest::newRow("env: malformed tokens skipped")
        << QByteArray("abc,,800x600 x600\t\t1024x768+10 garbage") << wide
        << "0,0,800x600 P; 800,0,1024x768" << -1;
    QTest::newRow("env: empty") << QByteArray("") << wide << "" << -1;
    QTest::newRow("env: nothing readable") << QByteArray("monitors please") << wide << "" << -1;

    QTest::newRow("stretched 3840x1200")
        << QByteArray() << Screens{screen(0, 0, 3840, 1200, 40)}
        << "0,0,1920x1200/0,0,1920x1160 P S; 1920,0,1920x1200/1920,0,1920x1160 S" << 0;
    QTest::newRow("2560x1080 is not stretched")
        << QByteArray() << Screens{screen(0, 0, 2560, 1080)} << "0,0,2560x1080 P" << -1;
    QTest::newRow("exactly 2.5 : 1") << QByteArray() << Screens{screen(0, 0, 2500, 1000)}
                                     << "0,0,1250x1000 P S; 1250,0,1250x1000 S" << 0;
    QTest::newRow("odd width 3841") << QByteArray() << Screens{screen(100, 0, 3841, 1200)}
                                    << "100,0,1920x1200 P S; 2020,0,1920x1200 S" << 0;
    QTest::newRow("sorted by x then y, span found after sorting")
        << QByteArray()
        << Screens{screen(0, 0, 1920, 1200), screen(1920, 0, 3840, 1200),
                   screen(-1280, 200, 1280, 1024), screen(-1280, -824, 1280, 1024)}
        << "-1280,-824,1280x1024; -1280,200,1280x1024; 0,0,1920x1200 P; 1920,0,1920x1200 S; "
           "3840,0,1920x1200 S"
        << 3;
    QTest::newRow("leftmost of two stretched screens")
        << QByteArray() << Screens{screen(0, 0, 3840, 1200), screen(-3840, 0, 3840, 1200)}
        << "-3840,0,1920x1200 S; -1920,0,1920x1200 S; 0,0,1920x1200 P S; 1920,0,1920x1200 S" << 0;
}

void TestDesktop::getDisplayInfo()
{
    QFETCH(QByteArray, monitors);
    QFETCH(Screens, screens);
    QFETCH(QString, expected);
    QFETCH(int, spanIndex);
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

void TestDesktop::appendsToExisting()
{
    // From the environment: placed after the entry that was there, not primary, its span kept.
    qputenv("TESSEL_MONITORS", "640x480");
    std::vector<DisplayInfo> displays(1);
    displays[0].x = 100;
    displays[0].w = 300;
    displays[0].span = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), 2);
    QCOMPARE(describe({displays[1]}), QStringLiteral("400,0,640x480"));
    QCOMPARE(ZuDesktop::Internal::spanIndex(), 0);

    // The window system reports nothing: nothing appended, nothing else changed.
    qunsetenv("TESSEL_MONITORS");
    bool fromEnvironment = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, &fromEnvironment), 2);
    QVERIFY(fromEnvironment);
    QCOMPARE(ZuDesktop::Internal::spanIndex(), 0);

    // From the window system: sorted together with the entry that was there.
    sScreens = {screen(0, 0, 1920, 1200)};
    displays.assign(1, DisplayInfo());
    displays[0].x = 5000;
    displays[0].w = displays[0].h = 100;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, nullptr), 2);
    QCOMPARE(describe(displays), QStringLiteral("0,0,1920x1200 P; 5000,0,100x100/0,0,0x0"));
}

void TestDesktop::placement()
{
    qputenv("TESSEL_MONITORS", "1920x1080-1920+0 1920x1080 1280x1024");
    const QList<QRect> found = {QRect(100, 100, 400, 300), QRect(-1000, 1, 10, 10),
                                QRect(3000, 500, 100, 100)};
    const QList<QPoint> centres = {QPoint(960, 540), QPoint(-960, 540), QPoint(1920 + 640, 512)};
    for (int i = 0; i < found.size(); ++i) {
        const QRect r = found[i];
        int cx = -1, cy = -1;
        QVERIFY(ZuDesktop::getRelCenteredDisplayPos(r.x(), r.y(), r.width(), r.height(), cx, cy));
        QCOMPARE(QPoint(cx, cy), centres[i]);
    }
    // Touching an edge, reaching the last row/column or straddling finds no monitor.
    for (const QRect& r : {QRect(0, 100, 10, 10), QRect(100, 0, 10, 10), QRect(100, 100, 1820, 10),
                           QRect(-100, 100, 200, 10)}) {
        int cx = 42, cy = 42;
        QVERIFY(!ZuDesktop::getRelCenteredDisplayPos(r.x(), r.y(), r.width(), r.height(), cx, cy));
        QCOMPARE(QPoint(cx, cy), QPoint(42, 42));
    }
}

void TestDesktop::debugDump()
{
    qputenv("TESSEL_MONITORS", "800x600+0+0,800x600");
    RkLogCapture capture;
    std::vector<DisplayInfo> displays;
    ZuDesktop::getDisplayInfo(displays, nullptr);
    QCOMPARE(capture.texts().size(), size_t(0)); // off by default

    ZuDesktop::setDebugDumpEnabled(true);
    for (int i = 0; i < 2; ++i) { // written once only
        displays.clear();
        ZuDesktop::getDisplayInfo(displays, nullptr);
    }
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
