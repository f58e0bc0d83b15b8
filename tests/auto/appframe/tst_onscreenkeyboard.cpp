#include "TestSupport.h"

#include "zubase/PnResource.h"
#include "zubase/ZuOnScreenKeyboard.h"
#include "zubase/ZuPopupMenuComboBox.h"

#include <QApplication>
#include <QComboBox>
#include <QLineEdit>
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

    QStringList errors;
    QStringList logs;
    std::function<void()> onError;

protected:
    void error(const QString& inMessage) override
    {
        errors << inMessage;
        if (onError)
            onError();
    }
    void log(const QString& inText) override { logs << inText; }
};

void send(Keyboard& inKeyboard, QObject* inWatched, QEvent::Type inType)
{
    QEvent event(inType);
    QCOMPARE(inKeyboard.eventFilter(inWatched, &event), false);
}

void focusIn(Keyboard& inKeyboard, QObject* inWatched)
{
    QFocusEvent event(QEvent::FocusIn);
    QCOMPARE(inKeyboard.eventFilter(inWatched, &event), false);
}

QSettings& settings()
{
    return PnResource::applicationSettings();
}

} // namespace

class TestOnScreenKeyboard : public QObject
{
    Q_OBJECT

    QTemporaryDir mDir;

    QString logPath() const { return mDir.filePath("keyboard.log"); }
    // The pids of the fake keyboard programs started so far, and of those with a window.
    QStringList started(const char* inPrefix = "") const
    {
        QFile file(logPath());
        QStringList pids;
        if (file.open(QIODevice::ReadOnly)) {
            for (const QByteArray& line : file.readAll().split('\n')) {
                const QByteArray prefix(inPrefix);
                if (!line.isEmpty() && line.startsWith(prefix) && line.mid(prefix.size()).toInt())
                    pids << QString::fromLatin1(line.mid(prefix.size()));
            }
        }
        return pids;
    }
    static bool alive(const QString& inPid) { return ::kill(inPid.toInt(), 0) == 0; }

private Q_SLOTS:
    void initTestCase();
    void init();
    void settingsRead_data();
    void settingsRead();
    void textInputs_data();
    void textInputs();
    void startedOnceWhileRunning();
    void missingProgramOneErrorBox();
    void blockedAfterActivation();
    void focusGoesBack();
    void minimisedWindowEndsKeyboard();
    void minimisedKeyboardWindowRestarts_data();
    void minimisedKeyboardWindowRestarts();
};

void TestOnScreenKeyboard::initTestCase()
{
    QVERIFY(mDir.isValid());
    qputenv("XDG_CONFIG_HOME", QFile::encodeName(mDir.filePath("config")));
    qputenv("FAKE_KEYBOARD_LOG", QFile::encodeName(logPath()));
    QCOMPARE(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, "UI.OnScreenKeyboardMode");
    QCOMPARE(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID, "UI.OnScreenKeyboardCommand");
    QCOMPARE(ZuOnScreenKeyboard::DEFAULT_KEYBOARD_CMD, "C:\\Windows\\System32\\osk.exe");
}

void TestOnScreenKeyboard::init()
{
    QFile::remove(logPath());
    qunsetenv("FAKE_KEYBOARD_WINDOW");
    settings().setValue(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, "SHOW");
    settings().setValue(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID,
                        TestSupport::helper("fake_onscreenkeyboard"));
    Keyboard().resetCommandCheck();
}

void TestOnScreenKeyboard::settingsRead_data()
{
    QTest::addColumn<QString>("mode");
    QTest::addColumn<bool>("enabled");
    QTest::addColumn<QString>("command");
    QTest::addColumn<QString>("used");
    QTest::newRow("SHOW, default program") << "SHOW" << true << ""
                                           << "onboard";
    QTest::newRow("show") << "show" << true << "/opt/kb"
                          << "/opt/kb";
    QTest::newRow("Show") << "Show" << true << "kb --x"
                          << "kb --x";
    QTest::newRow("empty") << "" << false << ""
                           << "onboard";
    QTest::newRow("HIDE") << "HIDE" << false << ""
                          << "onboard";
    QTest::newRow("SHOWN") << "SHOWN" << false << ""
                           << "onboard";
}

void TestOnScreenKeyboard::settingsRead()
{
    QFETCH(QString, mode);
    QFETCH(bool, enabled);
    QFETCH(QString, command);
    QFETCH(QString, used);
    settings().setValue(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, mode);
    settings().setValue(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID, command);
    Keyboard keyboard;
    QCOMPARE(keyboard.isKeyboardEnabled(), enabled);
    QCOMPARE(keyboard.commandLine(), used);
}

void TestOnScreenKeyboard::textInputs_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<bool>("starts");
    QTest::newRow("line edit") << "line edit" << true;
    QTest::newRow("text edit") << "text edit" << true;
    QTest::newRow("spin box") << "spin box" << true;
    QTest::newRow("editable combo box") << "editable combo" << true;
    QTest::newRow("plain combo box") << "combo" << false;
    QTest::newRow("push button") << "button" << false;
    QTest::newRow("opted-out line edit") << "opted out" << false;
}

void TestOnScreenKeyboard::textInputs()
{
    QFETCH(QString, kind);
    QFETCH(bool, starts);
    std::unique_ptr<QWidget> widget;
    if (kind == "line edit" || kind == "opted out")
        widget.reset(new QLineEdit);
    else if (kind == "text edit")
        widget.reset(new QTextEdit);
    else if (kind == "spin box")
        widget.reset(new QSpinBox);
    else if (kind == "button")
        widget.reset(new QPushButton);
    else {
        auto* combo = new QComboBox;
        combo->setEditable(kind == "editable combo");
        widget.reset(combo);
    }
    if (kind == "opted out")
        widget->setProperty("ZuOnScreenKeyboard.blocked", false);

    Keyboard keyboard;
    focusIn(keyboard, widget.get());
    QCOMPARE(keyboard.logs.filter("keyboard started").size(), starts ? 1 : 0);
    QTRY_COMPARE(started().size(), starts ? 1 : 0);
    // Not for a disabled mode either.
    settings().setValue(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID, "HIDE");
    keyboard.closeKeyboard();
    focusIn(keyboard, widget.get());
    QCOMPARE(keyboard.logs.filter("keyboard started").size(), starts ? 1 : 0);
}

void TestOnScreenKeyboard::startedOnceWhileRunning()
{
    QLineEdit first, second;
    Keyboard keyboard;
    focusIn(keyboard, &first);
    focusIn(keyboard, &second);
    focusIn(keyboard, &first);
    QTRY_COMPARE(started().size(), 1);
    const QString pid = started().first();
    QCOMPARE(keyboard.logs.filter("keyboard started").size(), 1);
    QVERIFY(keyboard.errors.isEmpty());

    keyboard.closeKeyboard();
    QCOMPARE(keyboard.logs.mid(1), QStringList({"ZuOnScreenKeyboard - closing keyboard app.\n",
                                                "ZuOnScreenKeyboard - terminating process\n",
                                                "ZuOnScreenKeyboard - success\n"}));
    QTRY_VERIFY(!alive(pid));

    // Ended from outside: the next focus starts a new one.
    focusIn(keyboard, &second);
    QTRY_COMPARE(started().size(), 2);
    ::kill(started().last().toInt(), SIGTERM);
    QTRY_VERIFY(!alive(started().last()));
    focusIn(keyboard, &first);
    QTRY_COMPARE(started().size(), 3);
}

void TestOnScreenKeyboard::missingProgramOneErrorBox()
{
    const QString missing = mDir.filePath("no-such-keyboard");
    settings().setValue(ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID, missing);
    QLineEdit edit;
    Keyboard keyboard;
    // While the box is open the block may end and the focus come back.
    keyboard.onError = [&] {
        keyboard.unblockKeyboard();
        focusIn(keyboard, &edit);
    };
    focusIn(keyboard, &edit);
    QCOMPARE(keyboard.errors,
             QStringList{QStringLiteral("Failed to open on-screen keyboard '%1'").arg(missing)});
    focusIn(keyboard, &edit);
    Keyboard other; // the failure holds for the whole process
    focusIn(other, &edit);
    QCOMPARE(keyboard.errors.size() + other.errors.size(), 1);

    keyboard.resetCommandCheck();
    focusIn(keyboard, &edit);
    QCOMPARE(keyboard.errors.size(), 2);
    QVERIFY(keyboard.logs.filter("keyboard started").isEmpty());
}

void TestOnScreenKeyboard::blockedAfterActivation()
{
    QLineEdit edit;
    Keyboard keyboard;
    send(keyboard, qApp, QEvent::ApplicationActivate);
    focusIn(keyboard, &edit);
    QTest::qWait(20);
    focusIn(keyboard, &edit);
    QVERIFY(keyboard.logs.isEmpty());
    QTest::qWait(300);
    focusIn(keyboard, &edit);
    QCOMPARE(keyboard.logs.filter("keyboard started").size(), 1);
}

void TestOnScreenKeyboard::focusGoesBack()
{
    QWidget first, second;
    auto* combo = new ZuPopupMenuComboBox(&first);
    first.show();
    second.show();
    first.activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(&first));
    QSignalSpy editing(combo, &ZuPopupMenuLineEdit::startEditingAtPosition);

    Keyboard keyboard;
    focusIn(keyboard, combo);
    QCOMPARE(keyboard.logs.filter("keyboard started").size(), 1);
    second.activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(&second));
    // The keyboard took the foreground: the remembered input and window get it back.
    send(keyboard, qApp, QEvent::ApplicationDeactivate);
    QTRY_COMPARE(editing.size(), 1);
    QTRY_COMPARE(QGuiApplication::focusWindow(), first.windowHandle());
    QCOMPARE(QApplication::focusWidget(), combo);
    // Both forgotten.
    keyboard.activateWindow();
    QCOMPARE(editing.size(), 1);

    // The input and its window may be gone by then.
    focusIn(keyboard, combo);
    delete combo;
    send(keyboard, qApp, QEvent::ApplicationDeactivate);
    QTest::qWait(50);
    keyboard.activateWindow();
    QCOMPARE(editing.size(), 1);
}

void TestOnScreenKeyboard::minimisedWindowEndsKeyboard()
{
    QWidget widget;
    QLineEdit edit(&widget);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QWindow* window = widget.windowHandle();
    Keyboard keyboard;
    focusIn(keyboard, &edit);
    QTRY_COMPARE(started().size(), 1);

    // Same state on both sides: nothing to do.
    QWindowStateChangeEvent same(window->windowStates());
    keyboard.eventFilter(window, &same);
    QTest::qWait(50);
    QVERIFY(alive(started().first()));

    QWindowStateChangeEvent restored(Qt::WindowMinimized);
    keyboard.eventFilter(window, &restored);
    QTRY_VERIFY(!alive(started().first()));
    QVERIFY(keyboard.logs.contains("ZuOnScreenKeyboard - terminating process\n"));
}

void TestOnScreenKeyboard::minimisedKeyboardWindowRestarts_data()
{
    QTest::addColumn<QByteArray>("state");
    QTest::addColumn<int>("starts");
    QTest::newRow("normal") << QByteArray("normal") << 1;
    QTest::newRow("iconic") << QByteArray("iconic") << 2;
}

// Needs an X server (run under xvfb-run); the keyboard asks it on its own connection.
void TestOnScreenKeyboard::minimisedKeyboardWindowRestarts()
{
    QFETCH(QByteArray, state);
    QFETCH(int, starts);
    if (qEnvironmentVariableIsEmpty("DISPLAY"))
        QSKIP("no X server (DISPLAY is not set)");
    qputenv("FAKE_KEYBOARD_WINDOW", state);
    QLineEdit edit;
    Keyboard keyboard;
    focusIn(keyboard, &edit);
    QTRY_COMPARE(started("window ").size(), 1);
    focusIn(keyboard, &edit);
    QTRY_COMPARE(started().size(), starts);
    QCOMPARE(alive(started().first()), starts == 1);
}

QTEST_MAIN(TestOnScreenKeyboard)
#include "tst_onscreenkeyboard.moc"
