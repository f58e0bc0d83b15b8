// Desktop geometry, the physical mouse-button state, dialog placement and the message-box width
// rule against a real X server: run under xvfb-run with three screens of the sizes the
// stretched-screen rule has to tell apart, the first (primary) 1920 x 1200.
#include "zubase/ZuApplication.h"
#include "zubase/ZuDesktop.h"
#include "zubase/ZuDialog.h"
#include "zubase/ZuMessageBox.h"

#include <QLabel>
#include <QLayout>
#include <QScreen>
#include <QX11Info>
#include <QtTest>

#include <dlfcn.h>

#include <X11/Xlib.h>

class TestAppFrameXvfb : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void screens();
    void mouseButtons2_data();
    void mouseButtons2();
    void keptOnScreen();
    void messageBoxWidth_data();
    void messageBoxWidth();
};

void TestAppFrameXvfb::initTestCase()
{
    QVERIFY(QX11Info::isPlatformX11());
    QCOMPARE(QGuiApplication::primaryScreen()->availableGeometry().width(), 1920);
}

void TestAppFrameXvfb::screens()
{
    // Separate X screens each start at the origin of their own coordinates; the list keeps the
    // screens' order for equal positions.
    qunsetenv("TESSEL_MONITORS");
    QCOMPARE(QGuiApplication::screens().size(), 3);
    std::vector<ZuDesktop::DisplayInfo> displays;
    bool fromEnvironment = true;
    QCOMPARE(ZuDesktop::getDisplayInfo(displays, &fromEnvironment), 4);
    QCOMPARE(fromEnvironment, false);
    QStringList got;
    for (const ZuDesktop::DisplayInfo& d : displays)
        got << QStringLiteral("%1,%2,%3x%4").arg(d.x).arg(d.y).arg(d.w).arg(d.h) +
                   (d.isPrimary ? " P" : "") + (d.span ? " S" : "");
    QCOMPARE(got, QStringList({"0,0,1920x1200 P", "0,0,1920x1200 S", "0,0,2560x1080",
                               "1920,0,1920x1200 S"}));
    int x = 0, y = 0, w = 0, h = 0;
    QVERIFY(ZuDesktop::centerPositionOnSpan(x, y, w, h));
    QCOMPARE(QList<int>({x, y, w, h}), QList<int>({960, 600, 1920, 1200}));
}

void TestAppFrameXvfb::mouseButtons2_data()
{
    QTest::addColumn<int>("screen");
    QTest::newRow("pointer on the application's screen") << 0;
    QTest::newRow("pointer on another X screen") << 1;
}

void TestAppFrameXvfb::mouseButtons2()
{
    // Press buttons through the XTEST extension and read them back from the server, not from
    // Qt's event queue (no event is processed in between).
    QFETCH(int, screen);
    void* xtst = dlopen("libXtst.so.6", RTLD_NOW);
    if (!xtst)
        QSKIP("libXtst is not installed");
    using FakeButton = int (*)(Display*, unsigned int, int, unsigned long);
    auto fakeButton = reinterpret_cast<FakeButton>(dlsym(xtst, "XTestFakeButtonEvent"));
    QVERIFY(fakeButton);
    Display* display = QX11Info::display();
    XWarpPointer(display, 0, RootWindow(display, screen), 0, 0, 0, 0, 100, 100);
    // Each step: button to press or release (negative), then the state expected.
    const QList<QPair<QList<int>, Qt::MouseButtons>> steps = {
        {{}, Qt::NoButton},
        {{1, 3}, Qt::LeftButton | Qt::RightButton},
        {{-1, 2}, Qt::MiddleButton | Qt::RightButton},
        {{-2, -3}, Qt::NoButton}};
    for (const auto& step : steps) {
        for (int button : step.first)
            fakeButton(display, unsigned(std::abs(button)), button > 0 ? True : False, 0);
        XSync(display, False);
        QCOMPARE(ZuApplication::mouseButtons2(), step.second);
    }
}

void TestAppFrameXvfb::keptOnScreen()
{
    // The main window hangs over the bottom-right corner; without a window manager there are
    // no frames. Centre (1900, 1150) less half the dialog, then pulled back onto the screen.
    QWidget main;
    main.setGeometry(1700, 1000, 400, 300);
    main.show();
    ZuDialog dialog(&main);
    dialog.resize(300, 200);
    dialog.show();
    QCOMPARE(dialog.frameGeometry(), QRect(1619, 999, 300, 200));
}

void TestAppFrameXvfb::messageBoxWidth_data()
{
    QTest::addColumn<QString>("text");
    QTest::newRow("short") << QStringLiteral("Done.");
    QTest::newRow("long")
        << QStringLiteral("A rather long message that does not fit ").repeated(12);
}

void TestAppFrameXvfb::messageBoxWidth()
{
    // W = 1919: limit = min(960, 1440, 1000) = 960 pixels of total minimum width. A long text
    // gives up its excess, a short one keeps its width.
    QFETCH(QString, text);
    const int limit = 960;
    // The same box without the rule, measured the way the rule measures.
    QMessageBox twin(QMessageBox::Warning, "t", text, QMessageBox::Ok);
    QLabel* twinLabel = twin.findChild<QLabel*>(QStringLiteral("qt_msgbox_label"));
    QVERIFY(twinLabel);
    twinLabel->setWordWrap(false);
    twinLabel->setMinimumWidth(0);
    twin.layout()->activate();
    const int total = twin.layout()->totalMinimumSize().width();
    const int hint = twinLabel->sizeHint().width();
    QCOMPARE(total > limit, text.size() > 100);

    ZuMessageBox box(nullptr);
    box.setIcon(QMessageBox::Warning);
    box.setWindowTitle("t");
    box.setText(text);
    box.setStandardButtons(QMessageBox::Ok);
    QCOMPARE(box.findLabel(), box.findChild<QLabel*>(QStringLiteral("qt_msgbox_label")));
    box.show();
    QCOMPARE(box.findLabel()->minimumWidth(), total > limit ? hint - (total - limit) : hint);
    // What the rule leaves for the whole box: exactly the limit.
    box.findLabel()->setWordWrap(false);
    box.layout()->activate();
    QCOMPARE(box.layout()->totalMinimumSize().width(), std::min(total, limit));
}

int main(int argc, char** argv, char** envp)
{
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, envp));
    TestAppFrameXvfb test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_appframe_xvfb.moc"
