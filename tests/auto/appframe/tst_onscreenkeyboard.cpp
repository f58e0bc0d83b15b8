#include "TestSupport.h"

#include "zubase/PnResource.h"
#include "zubase/ZuOnScreenKeyboard.h"
#include "zubase/ZuPopupMenuComboBox.h"
#include "zubase/platform/SysProcess.h"

#include <QApplication>
#include <QComboBox>
#include <QPushButton>
#include <QSettings>
#include <QSpinBox>
#include <QTemporaryDir>
#include <QTextEdit>
#include <QWindow>
#include <QWindowStateChangeEvent>

#include <csignal>
#include <functional>

namespace {

class Keyboard : public ZuOnScreenKeyboard
{
public:
    ~Keyboard() override { closeKeyboard(); }
    using ZuOnScreenKeyboard::commandLine;
    using ZuOnScreenKeyboard::resetCommandCheck;
    QStringList errors, logs;
    std::function<void()> onError;

    void focusIn(QObject* inWatched, QEvent::Type inType = QEvent::FocusIn)
    {
        QFocusEvent event(inType);
        QVERIFY(!eventFilter(inWatched, &event));
    }
    int starts() const { return logs.filter("keyboard started").size(); }

protected:
    void error(const QString& inMessage) override
    {
        errors << inMessage;
        if (onError)
            onError();
    }
    void log(const QString& inText) override { logs << inText; }
};

void setting(const char* inKey, const QString& inValue)
{
    PnResource::applicationSettings().setValue(inKey, inValue);
}

} // namespace

class TestOnScreenKeyboard : public QObject
{
    Q_OBJECT
    QTemporaryDir mDir;

    // The pids the fake keyboard program wrote: at its start, or with inPrefix once its
    // window is up.
    QStringList started(const QByteArray& inPrefix = "") const
    {
        QFile file(mDir.filePath("keyboard.log"));
        QStringList pids;
        file.open(QIODevice::ReadOnly);
        for (const QByteArray& line : file.readAll().split('\n')) {
            if (line.startsWith(inPrefix) && line.mid(inPrefix.size()).toInt() > 0)
                pids << QString::fromLatin1(line.mid(inPrefix.size()));
        }
        return pids;
    }
    static bool alive(const QString& inPid) { return ::kill(inPid.toInt(), 0) == 0; }

private Q_SLOTS:
    void initTestCase()
    {
        qputenv("XDG_CONFIG_HOME", QFile::encodeName(mDir.filePath("config")));
        qputenv("FAKE_KEYBOARD_LOG", QFile::encodeName(mDir.filePath("keyboard.log")));
        QCOMPARE(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, "UI.OnScreenKeyboardMode");
        QCOMPARE(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID, "UI.OnScreenKeyboardCommand");
        QCOMPARE(ZuOnScreenKeyboard::DEFAULT_KEYBOARD_CMD, "C:\\Windows\\System32\\osk.exe");
        setting(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID, ""); // Linux: onboard, not osk
        QCOMPARE(Keyboard().commandLine(), "onboard");
    }

    void init()
    {
        QFile::remove(mDir.filePath("keyboard.log"));
        setting(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, "SHOW");
        setting(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID,
                TestSupport::helper("fake_onscreenkeyboard"));
        Keyboard().resetCommandCheck();
    }

    void textInputs_data()
    {
        QTest::addColumn<QString>("kind");
        QTest::addColumn<QString>("mode");
        QTest::addColumn<bool>("starts");
        QTest::newRow("line edit, SHOW") << "line edit"
                                         << "SHOW" << true;
        QTest::newRow("line edit, show") << "line edit"
                                         << "show" << true;
        QTest::newRow("line edit, SHOWN") << "line edit"
                                          << "SHOWN" << false;
        QTest::newRow("line edit, empty") << "line edit"
                                          << "" << false;
        QTest::newRow("opted-out line edit") << "opted out"
                                             << "Show" << false;
        QTest::newRow("text edit") << "text edit"
                                   << "SHOW" << true;
        QTest::newRow("spin box") << "spin box"
                                  << "SHOW" << true;
        QTest::newRow("editable combo box") << "editable combo"
                                            << "SHOW" << true;
        QTest::newRow("plain combo box") << "combo"
                                         << "SHOW" << false;
        QTest::newRow("push button") << "button"
                                     << "SHOW" << false;
    }

    void textInputs()
    {
        QFETCH(QString, kind);
        QFETCH(QString, mode);
        QFETCH(bool, starts);
        std::unique_ptr<QWidget> widget;
        if (kind == "text edit")
            widget.reset(new QTextEdit);
        else if (kind == "spin box")
            widget.reset(new QSpinBox);
        else if (kind == "button")
            widget.reset(new QPushButton);
        else if (kind.endsWith("combo"))
            widget.reset(new QComboBox);
        else
            widget.reset(new QLineEdit);
        if (auto* combo = qobject_cast<QComboBox*>(widget.get()))
            combo->setEditable(kind == "editable combo");
        if (kind == "opted out")
            widget->setProperty("ZuOnScreenKeyboard.blocked", false);
        setting(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, mode);
        Keyboard keyboard;
        keyboard.focusIn(widget.get());
        QCOMPARE(keyboard.starts(), starts ? 1 : 0);
        QTRY_COMPARE(started().size(), starts ? 1 : 0);
    }

    void startedOnceWhileRunning()
    {
        QWidget widget;
        QLineEdit first(&widget), second(&widget);
        widget.show();
        QVERIFY(QTest::qWaitForWindowExposed(&widget));
        Keyboard keyboard;
        keyboard.focusIn(&first);
        keyboard.focusIn(&second);
        QTRY_COMPARE(started().size(), 1);
        QCOMPARE(keyboard.starts(), 1);
        // A window restored (or minimised) ends it; a state change without that does not.
        QWindowStateChangeEvent same(widget.windowHandle()->windowStates());
        keyboard.eventFilter(widget.windowHandle(), &same);
        QWindowStateChangeEvent restored(Qt::WindowMinimized);
        QVERIFY(alive(started().first()));
        keyboard.eventFilter(widget.windowHandle(), &restored);
        QCOMPARE(keyboard.logs.mid(1), QStringList({"ZuOnScreenKeyboard - closing keyboard app.\n",
                                                    "ZuOnScreenKeyboard - terminating process\n",
                                                    "ZuOnScreenKeyboard - success\n"}));
        QTRY_VERIFY(!alive(started().first()));
        QTRY_COMPARE(ZuPlatform::childrenTracked(), std::size_t(0)); // its handle is closed
        // Ended from outside: the next focus starts a new one.
        keyboard.focusIn(&first);
        QTRY_COMPARE(started().size(), 2);
        ::kill(started().last().toInt(), SIGTERM);
        QTRY_VERIFY(!alive(started().last()));
        keyboard.focusIn(&first);
        QCOMPARE(keyboard.starts(), 3);
    }

    void missingProgramOneErrorBox()
    {
        const QString missing = mDir.filePath("no-such-keyboard");
        setting(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID, missing);
        QLineEdit edit;
        Keyboard keyboard, other;
        // While the box is open the block may end and the focus come back.
        keyboard.onError = [&] {
            keyboard.unblockKeyboard();
            keyboard.focusIn(&edit);
        };
        keyboard.focusIn(&edit);
        QCOMPARE(keyboard.errors,
                 QStringList("Failed to open on-screen keyboard '" + missing + "'"));
        other.focusIn(&edit); // the failure holds for the whole process
        QCOMPARE(other.errors.size(), 0);
        keyboard.resetCommandCheck();
        keyboard.focusIn(&edit);
        QCOMPARE(keyboard.errors.size(), 2);
    }

    void blockedAfterActivation()
    {
        QLineEdit edit;
        Keyboard keyboard;
        keyboard.focusIn(qApp, QEvent::ApplicationActivate);
        keyboard.focusIn(&edit);
        QTest::qWait(20);
        keyboard.focusIn(&edit);
        QCOMPARE(keyboard.starts(), 0);
        QTest::qWait(300);
        keyboard.focusIn(&edit);
        QCOMPARE(keyboard.starts(), 1);
    }

    void focusGoesBack()
    {
        QWidget first, second;
        auto* combo = new ZuPopupMenuComboBox(&first);
        first.show();
        second.show();
        first.activateWindow();
        QVERIFY(QTest::qWaitForWindowActive(&first));
        QSignalSpy editing(combo, &ZuPopupMenuLineEdit::startEditingAtPosition);
        Keyboard keyboard;
        keyboard.focusIn(combo);
        second.activateWindow();
        QVERIFY(QTest::qWaitForWindowActive(&second));
        // The keyboard took the foreground: the remembered input and window get it back, once.
        keyboard.focusIn(qApp, QEvent::ApplicationDeactivate);
        QTRY_COMPARE(QGuiApplication::focusWindow(), first.windowHandle());
        QCOMPARE(QApplication::focusWidget(), combo);
        // Both are forgotten once given back.
        second.activateWindow();
        QVERIFY(QTest::qWaitForWindowActive(&second));
        keyboard.activateWindow();
        QTest::qWait(50);
        QCOMPARE(QGuiApplication::focusWindow(), second.windowHandle());
        QCOMPARE(editing.size(), 1);
        // The input may be gone by then.
        keyboard.focusIn(combo);
        delete combo;
        keyboard.activateWindow();
        QCOMPARE(editing.size(), 1);
    }

    // Needs an X server (the xvfb-run registration); the keyboard asks it on a connection of
    // its own.
    void minimisedKeyboardWindow_data()
    {
        QTest::addColumn<QByteArray>("state");
        QTest::newRow("normal") << QByteArray("normal");
        QTest::newRow("iconic") << QByteArray("iconic");
    }

    void minimisedKeyboardWindow()
    {
        QFETCH(QByteArray, state);
        if (qEnvironmentVariableIsEmpty("DISPLAY"))
            QSKIP("no X server (DISPLAY is not set)");
        qputenv("FAKE_KEYBOARD_WINDOW", state);
        QLineEdit edit;
        Keyboard keyboard;
        keyboard.focusIn(&edit);
        QTRY_COMPARE(started("window ").size(), 1);
        keyboard.focusIn(&edit);
        qunsetenv("FAKE_KEYBOARD_WINDOW");
        const bool iconic = state == "iconic";
        QCOMPARE(keyboard.starts(), iconic ? 2 : 1);
        QTRY_COMPARE(alive(started().first()), !iconic);
    }
};

QTEST_MAIN(TestOnScreenKeyboard)
#include "tst_onscreenkeyboard.moc"
