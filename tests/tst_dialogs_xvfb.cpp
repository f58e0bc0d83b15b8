// Dialog placement and the message-box width rule on a real X server with a 1920 x 1200
// screen (an Xvfb of its own; skipped when Xvfb is not installed).
#include "zubase/ZuApplication.h"
#include "zubase/ZuDialog.h"
#include "zubase/ZuMessageBox.h"

#include "helpers/XvfbServer.h"

#include <QLabel>
#include <QLayout>
#include <QScreen>
#include <QtTest>

namespace {
QString sSkipReason;
}

class TestDialogsXvfb : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void keptOnScreen();
    void messageBoxWidth();
};

void TestDialogsXvfb::initTestCase()
{
    if (!sSkipReason.isEmpty())
        QSKIP(qPrintable(sSkipReason));
    QCOMPARE(QGuiApplication::primaryScreen()->availableGeometry().width(), 1920);
}

void TestDialogsXvfb::keptOnScreen()
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

void TestDialogsXvfb::messageBoxWidth()
{
    // W = 1919: limit = min(960, 1440, 1000) = 960 pixels of total minimum width.
    const QString text = QStringLiteral("A rather long message that does not fit ").repeated(12);
    QMessageBox twin(QMessageBox::Warning, "t", text, QMessageBox::Ok);
    QLabel* twinLabel = twin.findChild<QLabel*>(QStringLiteral("qt_msgbox_label"));
    QVERIFY(twinLabel);
    twinLabel->setWordWrap(false);
    twinLabel->setMinimumWidth(0);
    twin.layout()->activate();
    const int total = twin.layout()->totalMinimumSize().width();
    const int hint = twinLabel->sizeHint().width();
    QVERIFY(total > 960);

    ZuMessageBox box(nullptr);
    box.setIcon(QMessageBox::Warning);
    box.setText(text);
    box.setStandardButtons(QMessageBox::Ok);
    box.show();
    QCOMPARE(box.findLabel()->minimumWidth(), hint - (total - 960));
    // What the rule leaves for the whole box: exactly the limit.
    box.findLabel()->setWordWrap(false);
    box.layout()->activate();
    QCOMPARE(box.layout()->totalMinimumSize().width(), 960);
}

int main(int argc, char** argv, char** envp)
{
    XvfbServer server({"1920x1200x24"});
    sSkipReason = server.skipReason();
    qputenv("QT_QPA_PLATFORM", server.isRunning() ? "xcb" : "offscreen");
    ZuApplication* app = ZuApplication::createInstance(argc, argv, envp);
    int result = 1;
    {
        TestDialogsXvfb test;
        result = QTest::qExec(&test, argc, argv);
    }
    delete app;
    return result;
}

#include "tst_dialogs_xvfb.moc"
