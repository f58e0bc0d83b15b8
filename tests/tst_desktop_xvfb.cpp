// Desktop geometry and the physical mouse-button state against a real X server: an Xvfb with
// three screens of the sizes the stretched-screen rule has to tell apart. Skipped when Xvfb is
// not installed.
#include "zubase/ZuApplication.h"
#include "zubase/ZuDesktop.h"

#include "helpers/XvfbServer.h"

#include <QScreen>
#include <QX11Info>
#include <QtTest>

#include <dlfcn.h>

#include <X11/Xlib.h>

namespace {
QString sSkipReason;
}

class TestDesktopXvfb : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void screens();
    void mouseButtons2();
};

void TestDesktopXvfb::initTestCase()
{
    if (!sSkipReason.isEmpty())
        QSKIP(qPrintable(sSkipReason));
    QVERIFY(QX11Info::isPlatformX11());
}

void TestDesktopXvfb::screens()
{
    qunsetenv("TESSEL_MONITORS");
    // Separate X screens each start at the origin of their own coordinates; the list keeps the
    // screens' order for equal positions.
    QCOMPARE(QGuiApplication::screens().size(), 3);
    std::vector<ZuDesktop::DisplayInfo> displays;
    bool fromEnvironment = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, &fromEnvironment), 4);
    QCOMPARE(fromEnvironment, false);
    QStringList got;
    for (const ZuDesktop::DisplayInfo& d : displays)
        got << QStringLiteral("%1,%2,%3x%4%5%6")
                   .arg(d.x)
                   .arg(d.y)
                   .arg(d.w)
                   .arg(d.h)
                   .arg(d.isPrimary ? " P" : "")
                   .arg(d.span ? " S" : "");
    QCOMPARE(got, QStringList({"0,0,1920x1200 P", "0,0,1920x1200 S", "0,0,2560x1080",
                               "1920,0,1920x1200 S"}));
    int x = 0, y = 0, w = 0, h = 0;
    QVERIFY(ZuDesktop::centerPositionOnSpan(x, y, w, h));
    QCOMPARE(QList<int>({x, y, w, h}), QList<int>({960, 600, 1920, 1200}));
}

void TestDesktopXvfb::mouseButtons2()
{
    // Press buttons through the XTEST extension and read them back from the server, not from
    // Qt's event queue (no event is processed in between).
    void* xtst = dlopen("libXtst.so.6", RTLD_NOW);
    if (!xtst)
        QSKIP("libXtst is not installed");
    using FakeButton = int (*)(Display*, unsigned int, int, unsigned long);
    auto fakeButton = reinterpret_cast<FakeButton>(dlsym(xtst, "XTestFakeButtonEvent"));
    QVERIFY(fakeButton);
    Display* display = QX11Info::display();

    QCOMPARE(ZuApplication::mouseButtons2(), Qt::MouseButtons(Qt::NoButton));
    fakeButton(display, 1, True, 0);
    fakeButton(display, 3, True, 0);
    XSync(display, False);
    QCOMPARE(ZuApplication::mouseButtons2(), Qt::MouseButtons(Qt::LeftButton | Qt::RightButton));
    fakeButton(display, 1, False, 0);
    fakeButton(display, 2, True, 0);
    XSync(display, False);
    QCOMPARE(ZuApplication::mouseButtons2(), Qt::MouseButtons(Qt::MiddleButton | Qt::RightButton));
    fakeButton(display, 2, False, 0);
    fakeButton(display, 3, False, 0);
    XSync(display, False);
    QCOMPARE(ZuApplication::mouseButtons2(), Qt::MouseButtons(Qt::NoButton));
}

int main(int argc, char** argv, char** envp)
{
    XvfbServer server({"1920x1200x24", "3840x1200x24", "2560x1080x24"});
    sSkipReason = server.skipReason();
    // Without a server the test case still runs, to report the skip.
    qputenv("QT_QPA_PLATFORM", server.isRunning() ? "xcb" : "offscreen");
    ZuApplication* app = ZuApplication::createInstance(argc, argv, envp);
    int result = 1;
    {
        TestDesktopXvfb test;
        result = QTest::qExec(&test, argc, argv);
    }
    delete app;
    return result;
}

#include "tst_desktop_xvfb.moc"
