// Against a real X server (xvfb-run with three screens of the sizes the stretched-screen rule
// has to tell apart, the first 1920 x 1200): the window system's monitor list, the physical
// mouse buttons on any screen, the message-box width rule at the screen size of its example.
#include "zubase/ZuApplication.h"
#include "zubase/ZuDesktop.h"
#include "zubase/ZuMessageBox.h"

#include <QLayout>
#include <QX11Info>
#include <QtTest>

#include <dlfcn.h>

#include <X11/Xlib.h>

class TestAppFrameXvfb : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void screens();
    void mouseButtons2();
    void messageBoxWidth();
};

void TestAppFrameXvfb::screens()
{
    // Separate X screens each start at the origin of their own coordinates; the sort keeps the
    // screens' order for equal positions.
    qunsetenv("TESSEL_MONITORS");
    std::vector<ZuDesktop::DisplayInfo> displays;
    bool fromEnvironment = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, &fromEnvironment), 4);
    QVERIFY(!fromEnvironment);
    QStringList got;
    for (const ZuDesktop::DisplayInfo& d : displays)
        got << QStringLiteral("%1,%2,%3x%4").arg(d.x).arg(d.y).arg(d.w).arg(d.h) +
                   (d.isPrimary ? " P" : "") + (d.span ? " S" : "");
    QCOMPARE(got, QStringList({"0,0,1920x1200 P", "0,0,1920x1200 S", "0,0,2560x1080",
                               "1920,0,1920x1200 S"}));
}

void TestAppFrameXvfb::mouseButtons2()
{
    // Buttons pressed through the XTEST extension are read back from the server, not from
    // Qt's event queue, also while the pointer is on another X screen.
    void* xtst = dlopen("libXtst.so.6", RTLD_NOW);
    if (!xtst)
        QSKIP("libXtst is not installed");
    using FakeButton = int (*)(Display*, unsigned int, int, unsigned long);
    auto fakeButton = reinterpret_cast<FakeButton>(dlsym(xtst, "XTestFakeButtonEvent"));
    Display* display = QX11Info::display();
    for (int screen : {0, 1}) {
        XWarpPointer(display, 0, RootWindow(display, screen), 0, 0, 0, 0, 100, 100);
        // Each step: buttons to press or release (negative), then the state expected.
        const QList<QPair<QList<int>, Qt::MouseButtons>> steps = {
            {{1, 3}, Qt::LeftButton | Qt::RightButton},
            {{-1, 2}, Qt::MiddleButton | Qt::RightButton},
            {{-2, -3}, Qt::NoButton}};
        for (const auto& [buttons, expected] : steps) {
            for (int button : buttons)
                fakeButton(display, unsigned(std::abs(button)), button > 0 ? True : False, 0);
            XSync(display, False);
            QCOMPARE(ZuApplication::mouseButtons2(), expected);
        }
    }
}

void TestAppFrameXvfb::messageBoxWidth()
{
    // W = 1919: a long text leaves the box min(960, 1440, 1000) = 960 pixels of minimum width.
    ZuMessageBox box(nullptr);
    box.setText(QStringLiteral("A rather long message that does not fit ").repeated(12));
    box.show();
    box.layout()->activate();
    QCOMPARE(box.layout()->totalMinimumSize().width(), 960);
}

int main(int argc, char** argv, char** envp)
{
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, envp));
    TestAppFrameXvfb test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_appframe_xvfb.moc"
