// The application object: environment snapshot, guarded dispatch with the notify stack and the
// deferred-delete check, hooks, wheel grab, busy cursor, flushing and the protocol handler.
#include "zubase/ZuApplication.h"
#include "zubase/ZuWheelGrabber.h"

#include "rklib/RkLogFile.h"

#include <QDialog>
#include <QEventLoop>
#include <QPointer>
#include <QPushButton>
#include <QSplashScreen>
#include <QTemporaryDir>
#include <QThread>
#include <QUrl>
#include <QtTest>

#include <memory>

namespace {

const QEvent::Type sTestEvent = QEvent::Type(QEvent::User + 1);

// Records "<name>.before" / "<name>.after" and the receiver for test and wheel events.
class RecordingHook : public ZuApplication::HookNotify
{
public:
    RecordingHook(const QString& inName, QStringList& inCalls) : mName(inName), mCalls(inCalls) {}
    void beforeNotify(QObject* inReceiver, QEvent* inEvent) override
    {
        record(".before", inReceiver, inEvent);
        if (removeSelf && inEvent->type() == sTestEvent)
            ZuApplication::deInstallHookNotify(this);
    }
    void afterNotify(QObject* inReceiver, QEvent* inEvent) override
    {
        record(".after", inReceiver, inEvent);
    }
    void record(const char* inPhase, QObject* inReceiver, QEvent* inEvent)
    {
        if (inEvent->type() == sTestEvent || inEvent->type() == QEvent::Wheel) {
            mCalls << mName + inPhase;
            receivers << inReceiver;
        }
    }
    QString mName;
    QStringList& mCalls;
    QList<QObject*> receivers;
    bool removeSelf = false;
};

// Counts test and wheel events and can run a handler inside a test event; with repost >= 0 it
// posts itself a new test event from each one until it has had repost of them.
class Receiver : public QObject
{
public:
    explicit Receiver(const QString& inName = QString(), QObject* inParent = nullptr)
        : QObject(inParent)
    {
        setObjectName(inName);
    }
    bool event(QEvent* inEvent) override
    {
        if (inEvent->type() == QEvent::Wheel) {
            ++wheels;
            return true;
        }
        if (inEvent->type() != sTestEvent)
            return QObject::event(inEvent);
        ++tests;
        if (onTestEvent)
            onTestEvent();
        if (repost == 0 || (repost > 0 && tests < repost))
            QCoreApplication::postEvent(this, new QEvent(sTestEvent));
        return true;
    }
    int wheels = 0;
    int tests = 0;
    int repost = -1; // -1: never; 0: for ever
    std::function<void()> onTestEvent;
};

void sendTestEvent(QObject* inReceiver)
{
    QEvent event(sTestEvent);
    QCoreApplication::sendEvent(inReceiver, &event);
}

void sendWheel(QObject* inReceiver)
{
    QWheelEvent wheel(QPointF(5, 5), QPointF(5, 5), QPoint(), QPoint(0, 120), Qt::NoButton,
                      Qt::NoModifier, Qt::NoScrollPhase, false);
    QCoreApplication::sendEvent(inReceiver, &wheel);
}

QStringList deferredDeleteLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries()) {
        if (entry.category == "DeferredDelete")
            lines << QString::number(entry.level) + ' ' + QString::fromStdString(entry.text);
    }
    return lines;
}

class FileOpenAccess : public ZuApplication
{
public:
    // Reaches the protected handler through a member pointer; no object of this class exists.
    static void handle(ZuApplication* inApp, const QString& inFile, const QUrl& inUrl)
    {
        (inApp->*(&FileOpenAccess::handleFileOpenEvent))(inFile, inUrl);
    }
};

} // namespace

class TestApplication : public QObject
{
    Q_OBJECT
private slots:
    void cleanup();
    void instanceAndMainThread();
    void environment_data();
    void environment();
    void hooks();
    void wheelGrab();
    void busyNesting();
    void flushPendingEvents();
    void protocolHandler_data();
    void protocolHandler();
    void deferredDelete();
    void deferredDeleteReportCap();
    void splashScreen();

private:
    std::vector<std::unique_ptr<ZuApplication::HookNotify>> mHooks;
    template <class T> T* install(T* inHook)
    {
        mHooks.emplace_back(inHook);
        ZuApplication::installHookNotify(inHook);
        return inHook;
    }
};

void TestApplication::cleanup()
{
    for (const auto& hook : mHooks)
        ZuApplication::deInstallHookNotify(hook.get());
    mHooks.clear();
    ZuWheelGrabber::releaseWheel(nullptr);
}

void TestApplication::instanceAndMainThread()
{
    ZuApplication* app = ZuApplication::instance();
    int argc = 1;
    char name[] = "again";
    char* argv[] = {name, nullptr};
    QCOMPARE(ZuApplication::createInstance(argc, argv, nullptr), app);
    QVERIFY(ZuApplication::isMainThread());
    bool workerIsMain = true;
    std::unique_ptr<QThread> worker(
        QThread::create([&workerIsMain] { workerIsMain = ZuApplication::isMainThread(); }));
    worker->start();
    QVERIFY(worker->wait(10000));
    QVERIFY(!workerIsMain);

    // Each handler sees its own level of the notify stack.
    Receiver outer, inner;
    QList<int> depths;
    inner.onTestEvent = [&] {
        depths << ZuApplication::callDepth_of_notify();
    };
    outer.onTestEvent = [&] {
        depths << ZuApplication::callDepth_of_notify();
        sendTestEvent(&inner);
    };
    sendTestEvent(&outer);
    QCOMPARE(depths, QList<int>({1, 2}));
    QCOMPARE(ZuApplication::callDepth_of_notify(), 0);
}

// main() hands these entries to createInstance().
static char sEnv0[] = "ZU_NAME=value=with=equals";
static char sEnv1[] = "=C:=C:\\work";
static char sEnv2[] = "ZU_EMPTY=";
static char sEnv3[] = "ZU_NOEQUALS";
static char sEnv4[] = "ZU_TWICE=first";
static char sEnv5[] = "ZU_TWICE=second";
static char sEnv6[] = "ZU_LATIN1=\xe9t\xe9";
static char* sEnvp[] = {sEnv0, sEnv1, sEnv2, sEnv3, sEnv4, sEnv5, sEnv6, nullptr};

void TestApplication::environment_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("value"); // null: absent
    QTest::newRow("value") << "ZU_NAME"
                           << "value=with=equals";
    QTest::newRow("empty value") << "ZU_EMPTY"
                                 << "";
    QTest::newRow("no equals sign") << "ZU_NOEQUALS" << QString();
    QTest::newRow("drive entry") << "" << QString();
    QTest::newRow("drive entry name") << "=C:" << QString();
    QTest::newRow("other case") << "zu_name" << QString();
    QTest::newRow("later wins") << "ZU_TWICE"
                                << "second";
    QTest::newRow("latin-1") << "ZU_LATIN1" << QString::fromUtf8("\xc3\xa9t\xc3\xa9");
}

void TestApplication::environment()
{
    QFETCH(QString, name);
    QFETCH(QString, value);
    ZuApplication* app = ZuApplication::instance();
    QCOMPARE(app->environment().size(), 4);
    QCOMPARE(app->environment().contains(name), !value.isNull());
    const QString found = app->environmentLookup(name);
    QCOMPARE(found.isNull(), value.isNull());
    QCOMPARE(found, value);
}

void TestApplication::hooks()
{
    QStringList calls;
    RecordingHook* h[5];
    for (int i = 0; i < 5; ++i) {
        h[i] = new RecordingHook(QString(QChar('a' + i)), calls);
        mHooks.emplace_back(h[i]);
    }
    Receiver receiver;
    QStringList seenInHandler;
    receiver.onTestEvent = [&] {
        seenInHandler = calls;
    };
    auto dispatch = [&] {
        calls.clear();
        sendTestEvent(&receiver);
        return calls.join(' ');
    };

    ZuApplication::installHookNotify(h[0]);
    ZuApplication::installHookNotify(h[0]); // one slot only
    ZuApplication::installHookNotify(h[1]);
    ZuApplication::installHookNotify(h[2]);
    ZuApplication::installHookNotify(h[3]); // table full: dropped
    QCOMPARE(dispatch(), QStringLiteral("a.before b.before c.before c.after b.after a.after"));
    QCOMPARE(seenInHandler, QStringList({"a.before", "b.before", "c.before"}));

    // b removes itself during dispatch: no after-call, the others keep their places.
    h[1]->removeSelf = true;
    QCOMPARE(dispatch(), QStringLiteral("a.before b.before c.before c.after a.after"));
    QCOMPARE(dispatch(), QStringLiteral("a.before c.before c.after a.after"));

    ZuApplication::deInstallHookNotify(h[0]); // slot 0 free, c stays in slot 2
    ZuApplication::deInstallHookNotify(h[4]); // not installed: ignored
    ZuApplication::installHookNotify(h[3]);   // first free slot: 0
    ZuApplication::installHookNotify(h[4]);   // then slot 1
    QCOMPARE(dispatch(), QStringLiteral("d.before e.before c.before c.after e.after d.after"));
}

void TestApplication::wheelGrab()
{
    QStringList calls;
    RecordingHook* hook = install(new RecordingHook(QStringLiteral("h"), calls));
    Receiver underPointer, a;
    auto* b = new Receiver;

    ZuWheelGrabber::grabWheel(&a);
    ZuWheelGrabber::grabWheel(b); // b takes the grab from a
    QCOMPARE(ZuWheelGrabber::grabObject(), b);
    sendWheel(&underPointer);
    sendTestEvent(&underPointer); // other events are not redirected
    QCOMPARE(QList<int>({b->wheels, a.wheels, underPointer.wheels}), QList<int>({1, 0, 0}));
    QCOMPARE(underPointer.tests, 1);
    // The hooks see the receiver that was asked for, not the grabber.
    QCOMPARE(hook->receivers.mid(0, 2), QList<QObject*>({&underPointer, &underPointer}));

    ZuWheelGrabber::releaseWheel(&a); // clears b's grab as well
    QCOMPARE(ZuWheelGrabber::grabObject(), nullptr);
    sendWheel(&underPointer);
    QCOMPARE(underPointer.wheels, 1);

    ZuWheelGrabber::grabWheel(b);
    delete b; // a destroyed grabber ends the grab
    QCOMPARE(ZuWheelGrabber::grabObject(), nullptr);
    sendWheel(&underPointer);
    QCOMPARE(underPointer.wheels, 2);
}

void TestApplication::busyNesting()
{
    QList<int> shapes;
    auto note = [&] {
        const QCursor* cursor = QGuiApplication::overrideCursor();
        shapes << (cursor ? int(cursor->shape()) : -1);
    };
    std::unique_ptr<ZuApplication::Busy> idle(new ZuApplication::Busy(false));
    note(); // outside a busy phase: nothing
    idle.reset();
    std::vector<std::unique_ptr<ZuApplication::Busy>> stack;
    for (bool busy : {true, false, true}) {
        stack.emplace_back(new ZuApplication::Busy(busy));
        note();
    }
    while (!stack.empty()) {
        stack.pop_back();
        note();
    }
    const int wait = Qt::WaitCursor, arrow = Qt::ArrowCursor;
    QCOMPARE(shapes, QList<int>({-1, wait, arrow, wait, arrow, wait, -1}));
}

void TestApplication::flushPendingEvents()
{
    Receiver finite; // a finite chain is delivered completely
    finite.repost = 6;
    QCoreApplication::postEvent(&finite, new QEvent(sTestEvent));
    ZuApplication::flushPendingEvents();
    QCOMPARE(finite.tests, 6);

    Receiver endless; // keeps posting: the flush gives up after its passes
    endless.repost = 0;
    QCoreApplication::postEvent(&endless, new QEvent(sTestEvent));
    ZuApplication::flushPendingEvents();
    const int afterFlush = endless.tests;
    QVERIFY2(afterFlush >= 19 && afterFlush <= 3 * 19, qPrintable(QString::number(afterFlush)));
    endless.repost = -1; // let the last posted event end the chain
    QTRY_COMPARE(endless.tests, afterFlush + 1);
}

void TestApplication::protocolHandler_data()
{
    QTest::addColumn<QString>("file");
    QTest::addColumn<QString>("url");
    QTest::addColumn<QStringList>("arguments"); // empty: nothing is started
    QTest::newRow("nothing") << QString() << QString() << QStringList();
    QTest::newRow("file with blanks")
        << "/data/my studies/case 1.cfg"
        << "tessel://ignored" << QStringList({"--cfgfile", "/data/my studies/case 1.cfg"});
    QTest::newRow("file with quotes")
        << "a\" --evil \"b.cfg" << QString() << QStringList({"--cfgfile", "a\" --evil \"b.cfg"});
    QTest::newRow("url with blanks")
        << QString() << "tessel://open?patient=John Doe&study=1 2"
        << QStringList({"tessel://open?patient=John%20Doe&study=1%202"});
}

void TestApplication::protocolHandler()
{
    QFETCH(QString, file);
    QFETCH(QString, url);
    QFETCH(QStringList, arguments);
    QVERIFY(QFileInfo::exists(QCoreApplication::applicationDirPath() + "/tzcontrol"));
    QTemporaryDir dir;
    QVERIFY(dir.isValid());
    const QString record = dir.filePath(QStringLiteral("arguments.txt"));
    qputenv("ZU_TZCONTROL_RECORD", QFile::encodeName(record));

    ZuApplication* app = ZuApplication::instance();
    QSignalSpy spy(app, &ZuApplication::protocolHandlerCalled);
    FileOpenAccess::handle(app, file, url.isEmpty() ? QUrl() : QUrl(url));
    QCOMPARE(spy.count(), arguments.isEmpty() ? 0 : 1);
    if (arguments.isEmpty()) {
        QVERIFY(!QFileInfo::exists(record));
        return;
    }
    QTRY_VERIFY_WITH_TIMEOUT(QFileInfo::exists(record), 10000);
    QFile recorded(record);
    QVERIFY(recorded.open(QIODevice::ReadOnly));
    QCOMPARE(QString::fromLocal8Bit(recorded.readAll()), arguments.join('\n') + '\n');
}

void TestApplication::deferredDelete()
{
    // A dialog is to be deleted from inside a nested loop that runs in the click handler of a
    // button two levels below it: the deletion waits until the button's handler has returned.
    RkLogCapture capture;
    auto* dialog = new QDialog;
    dialog->setObjectName(QStringLiteral("dialog"));
    auto* frame = new QWidget(dialog);
    new QWidget(dialog); // a sibling before the busy branch
    auto* button = new QPushButton(QStringLiteral("Go"), frame);
    button->setObjectName(QStringLiteral("button"));
    button->resize(80, 30);
    dialog->show();
    QPointer<QDialog> guard(dialog);

    int buttonLevel = -1, deleteLevel = -1;
    bool aliveInLoop = false;
    QObject::connect(button, &QPushButton::clicked, [&] {
        buttonLevel = ZuApplication::callDepth_of_notify() - 1;
        QEventLoop loop;
        QTimer::singleShot(0, &loop, [&] {
            dialog->deleteLater();
            deleteLevel = ZuApplication::callDepth_of_notify();
            // Ask for the deferred deletion now, while the button still handles its event.
            QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
            aliveInLoop = !guard.isNull();
            loop.quit();
        });
        loop.exec();
    });
    QTest::mouseClick(button, Qt::LeftButton);
    QVERIFY(aliveInLoop);
    QTRY_VERIFY(guard.isNull());
    // Pointers are written once as 0x and hex digits.
    const auto pointer = [](const void* p) {
        return QString::number(quintptr(p), 16);
    };
    QCOMPARE(deferredDeleteLines(capture),
             QStringList(QStringLiteral("4 deletion of [0x%1 dialog] in level [%2] would also "
                                        "delete [0x%3 button] which is still processing an event "
                                        "in level [%4]")
                             .arg(pointer(dialog))
                             .arg(deleteLevel)
                             .arg(pointer(button))
                             .arg(buttonLevel)));

    // Nobody of the tree busy: deleted at once, nothing logged.
    capture.clear();
    QPointer<QObject> free = new Receiver(QStringLiteral("free"));
    new Receiver(QStringLiteral("child"), free);
    free->deleteLater();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(free.isNull());
    QCOMPARE(deferredDeleteLines(capture), QStringList());
}

// Runs last: the report counter is process-wide and the earlier test used one report.
void TestApplication::deferredDeleteReportCap()
{
    RkLogCapture capture;
    const RkLogLevel outputLevel = getTheLogInstance().outputLevel();
    getTheLogInstance().setOutputLevel(RkLogOff);
    auto* busy = new Receiver(QStringLiteral("busy"));
    QPointer<QObject> guard(busy);
    bool aliveInHandler = false;
    busy->onTestEvent = [&] {
        // Every attempt is postponed; only the first 5000 of the process are reported.
        busy->deleteLater();
        for (int attempt = 0; attempt < 5000; ++attempt)
            QCoreApplication::sendPostedEvents(busy, QEvent::DeferredDelete);
        aliveInHandler = !guard.isNull();
    };
    sendTestEvent(busy);
    getTheLogInstance().setOutputLevel(outputLevel);
    QVERIFY(aliveInHandler);
    QTRY_VERIFY(guard.isNull());
    QCOMPARE(deferredDeleteLines(capture).size(), 5000 - 1);
}

void TestApplication::splashScreen()
{
    ZuApplication* app = ZuApplication::instance();
    QPixmap pixmap(30, 20);
    pixmap.fill(Qt::green);
    QPointer<QSplashScreen> first = new QSplashScreen(pixmap);
    app->setSplashScreen(first);
    QVERIFY(first->isVisible());
    QPointer<QSplashScreen> second = new QSplashScreen(pixmap);
    app->setSplashScreen(second); // replaces and deletes the first
    QVERIFY(first.isNull());
    app->setSplashScreen(second); // handed in again: kept
    QVERIFY(!second.isNull());
    // The host deletes its splash itself; closing it later must not delete it again.
    delete second;
    app->setSplashScreen(nullptr);
    app->setSplashScreen(new QSplashScreen(pixmap)); // and the next one is owned as before
    app->setSplashScreen(nullptr);
}

int main(int argc, char** argv)
{
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, sEnvp));
    TestApplication test;
    return app ? QTest::qExec(&test, argc, argv) : 1;
}

#include "tst_application.moc"
