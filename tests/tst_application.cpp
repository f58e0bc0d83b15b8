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

// Records which hook saw which phase of which event.
struct HookLog
{
    QStringList calls;
    QList<QObject*> receivers;
};

class RecordingHook : public ZuApplication::HookNotify
{
public:
    RecordingHook(const QString& inName, HookLog& inLog) : mName(inName), mLog(inLog) {}
    void beforeNotify(QObject* inReceiver, QEvent* inEvent) override
    {
        if (inEvent->type() != sTestEvent && inEvent->type() != QEvent::Wheel)
            return;
        mLog.calls << mName + QStringLiteral(".before");
        mLog.receivers << inReceiver;
        if (mRemoveSelfInBefore)
            ZuApplication::deInstallHookNotify(this);
    }
    void afterNotify(QObject* inReceiver, QEvent* inEvent) override
    {
        if (inEvent->type() != sTestEvent && inEvent->type() != QEvent::Wheel)
            return;
        mLog.calls << mName + QStringLiteral(".after");
        mLog.receivers << inReceiver;
    }

    QString mName;
    HookLog& mLog;
    bool mRemoveSelfInBefore = false;
};

// Counts the events it receives and can run a handler inside them.
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
        types << inEvent->type();
        if (inEvent->type() == sTestEvent && onTestEvent)
            onTestEvent();
        if (inEvent->type() == sTestEvent || inEvent->type() == QEvent::Wheel)
            return true;
        return QObject::event(inEvent);
    }
    int count(QEvent::Type inType) const { return int(types.count(inType)); }

    QList<QEvent::Type> types;
    std::function<void()> onTestEvent;
};

// Posts itself a new event from every event it gets, as long as it is told to.
class Reposter : public QObject
{
public:
    bool event(QEvent* inEvent) override
    {
        if (inEvent->type() != sTestEvent)
            return QObject::event(inEvent);
        ++delivered;
        if (repost < 0 || delivered < repost)
            QCoreApplication::postEvent(this, new QEvent(sTestEvent));
        return true;
    }
    int delivered = 0;
    int repost = -1; // -1: for ever
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

QString pointerText(const void* inPointer)
{
    return QStringLiteral("0x%1").arg(quintptr(inPointer), 0, 16);
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

class AboutReceiver : public QObject
{
    Q_OBJECT
public:
    int hits = 0;
public slots:
    void about() { ++hits; }
};

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

    void createInstance();
    void environment_data();
    void environment();
    void mainThread();
    void hookSlots();
    void hookOrderAndSelfRemoval();
    void hooksOnOtherThread();
    void wheelGrab();
    void busyNesting();
    void flushPendingEvents();
    void defaultParentSplashAbout();
    void protocolHandler_data();
    void protocolHandler();
    void deferredDeleteNestedLoop();
    void deferredDeleteGrandchild();
    void deferredDeleteReportCap();

private:
    QList<ZuApplication::HookNotify*> mInstalled;
};

void TestApplication::cleanup()
{
    for (ZuApplication::HookNotify* hook : mInstalled)
        ZuApplication::deInstallHookNotify(hook);
    qDeleteAll(mInstalled);
    mInstalled.clear();
    ZuWheelGrabber::releaseWheel(nullptr);
}

void TestApplication::createInstance()
{
    ZuApplication* app = ZuApplication::instance();
    QVERIFY(app);
    int argc = 1;
    char name[] = "again";
    char* argv[] = {name, nullptr};
    QCOMPARE(ZuApplication::createInstance(argc, argv, nullptr), app);
    QCOMPARE(app->metaObject()->className(), "ZuApplication");
    QCOMPARE(QGuiApplication::desktopSettingsAware(), false);
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
    QTest::addColumn<bool>("present");
    QTest::addColumn<QString>("value");
    QTest::newRow("value") << "ZU_NAME" << true << "value=with=equals";
    QTest::newRow("empty value") << "ZU_EMPTY" << true << "";
    QTest::newRow("no equals sign") << "ZU_NOEQUALS" << false << QString();
    QTest::newRow("drive entry") << "" << false << QString();
    QTest::newRow("drive entry name") << "=C:" << false << QString();
    QTest::newRow("other case") << "zu_name" << false << QString();
    QTest::newRow("later wins") << "ZU_TWICE" << true << "second";
    QTest::newRow("latin-1") << "ZU_LATIN1" << true << QString::fromUtf8("\xc3\xa9t\xc3\xa9");
}

void TestApplication::environment()
{
    QFETCH(QString, name);
    QFETCH(bool, present);
    QFETCH(QString, value);
    ZuApplication* app = ZuApplication::instance();
    QCOMPARE(app->environment().size(), 4);
    QCOMPARE(app->environment().contains(name), present);
    const QString found = app->environmentLookup(name);
    QCOMPARE(found.isNull(), !present);
    QCOMPARE(found, value);
}

void TestApplication::mainThread()
{
    QVERIFY(ZuApplication::isMainThread());
    QCOMPARE(ZuApplication::callDepth_of_notify(), 0);

    bool workerIsMain = true;
    std::unique_ptr<QThread> worker(
        QThread::create([&workerIsMain] { workerIsMain = ZuApplication::isMainThread(); }));
    worker->start();
    QVERIFY(worker->wait(10000));
    QVERIFY(!workerIsMain);

    // Inside a handler the receiver is on the stack.
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

void TestApplication::hookSlots()
{
    HookLog log;
    auto make = [&](const char* inName) {
        auto* hook = new RecordingHook(QString::fromLatin1(inName), log);
        mInstalled << hook;
        return hook;
    };
    RecordingHook* a = make("a");
    RecordingHook* b = make("b");
    RecordingHook* c = make("c");
    RecordingHook* d = make("d");
    RecordingHook* e = make("e");
    Receiver receiver;
    auto befores = [&] {
        log.calls.clear();
        sendTestEvent(&receiver);
        QStringList names;
        for (const QString& call : log.calls) {
            if (call.endsWith(QLatin1String(".before")))
                names << call.left(1);
        }
        return names.join(',');
    };

    ZuApplication::installHookNotify(a);
    ZuApplication::installHookNotify(a); // one slot only
    ZuApplication::installHookNotify(b);
    ZuApplication::installHookNotify(c);
    ZuApplication::installHookNotify(d); // table full: dropped
    QCOMPARE(befores(), QStringLiteral("a,b,c"));

    ZuApplication::deInstallHookNotify(a); // slot 0 free, c stays in slot 2
    ZuApplication::deInstallHookNotify(e); // not installed: ignored
    QCOMPARE(befores(), QStringLiteral("b,c"));
    ZuApplication::installHookNotify(d); // first free slot: 0
    QCOMPARE(befores(), QStringLiteral("d,b,c"));
    ZuApplication::deInstallHookNotify(b); // slots 0 and 2 filled
    ZuApplication::installHookNotify(e);   // lands in slot 1
    QCOMPARE(befores(), QStringLiteral("d,e,c"));
}

void TestApplication::hookOrderAndSelfRemoval()
{
    HookLog log;
    auto* a = new RecordingHook(QStringLiteral("a"), log);
    auto* b = new RecordingHook(QStringLiteral("b"), log);
    auto* c = new RecordingHook(QStringLiteral("c"), log);
    mInstalled << a << b << c;
    ZuApplication::installHookNotify(a);
    ZuApplication::installHookNotify(b);
    ZuApplication::installHookNotify(c);

    Receiver receiver;
    QStringList seenInHandler;
    receiver.onTestEvent = [&] {
        seenInHandler = log.calls;
    };
    sendTestEvent(&receiver);
    QCOMPARE(seenInHandler, QStringList({"a.before", "b.before", "c.before"}));
    QCOMPARE(log.calls,
             QStringList({"a.before", "b.before", "c.before", "c.after", "b.after", "a.after"}));

    // b removes itself before dispatch: it sees no after-call, the others keep their places.
    log.calls.clear();
    b->mRemoveSelfInBefore = true;
    sendTestEvent(&receiver);
    QCOMPARE(log.calls, QStringList({"a.before", "b.before", "c.before", "c.after", "a.after"}));
    log.calls.clear();
    sendTestEvent(&receiver);
    QCOMPARE(log.calls, QStringList({"a.before", "c.before", "c.after", "a.after"}));
}

void TestApplication::hooksOnOtherThread()
{
    // Hooks see events dispatched on any thread; only the main thread uses the notify stack.
    struct ThreadHook : ZuApplication::HookNotify
    {
        QAtomicInt workerCalls;
        QAtomicInt depthOnWorker{-1};
        void beforeNotify(QObject*, QEvent* inEvent) override
        {
            if (inEvent->type() == sTestEvent && !ZuApplication::isMainThread()) {
                workerCalls.ref();
                depthOnWorker = ZuApplication::callDepth_of_notify();
            }
        }
        void afterNotify(QObject*, QEvent* inEvent) override
        {
            if (inEvent->type() == sTestEvent && !ZuApplication::isMainThread())
                workerCalls.ref();
        }
    };
    auto* hook = new ThreadHook;
    mInstalled << hook;
    ZuApplication::installHookNotify(hook);

    QThread thread;
    auto* receiver = new Receiver;
    receiver->moveToThread(&thread);
    QObject::connect(&thread, &QThread::finished, receiver, &QObject::deleteLater);
    thread.start();
    QCoreApplication::postEvent(receiver, new QEvent(sTestEvent));
    QTRY_COMPARE(hook->workerCalls.loadAcquire(), 2);
    QCOMPARE(hook->depthOnWorker.loadAcquire(), 0);
    thread.quit();
    QVERIFY(thread.wait(10000));
}

void TestApplication::wheelGrab()
{
    HookLog log;
    auto* hook = new RecordingHook(QStringLiteral("h"), log);
    mInstalled << hook;
    ZuApplication::installHookNotify(hook);

    Receiver underPointer;
    Receiver a;
    auto* b = new Receiver;

    sendWheel(&underPointer);
    QCOMPARE(underPointer.count(QEvent::Wheel), 1);

    ZuWheelGrabber::grabWheel(&a);
    ZuWheelGrabber::grabWheel(b); // b takes the grab from a
    QCOMPARE(ZuWheelGrabber::grabObject(), b);
    log.receivers.clear();
    sendWheel(&underPointer);
    QCOMPARE(b->count(QEvent::Wheel), 1);
    QCOMPARE(a.count(QEvent::Wheel), 0);
    QCOMPARE(underPointer.count(QEvent::Wheel), 1);
    // The hooks see the receiver that was asked for, not the grabber.
    QCOMPARE(log.receivers, QList<QObject*>({&underPointer, &underPointer}));

    // Other events are not redirected.
    sendTestEvent(&underPointer);
    QCOMPARE(underPointer.count(sTestEvent), 1);
    QCOMPARE(b->count(sTestEvent), 0);

    ZuWheelGrabber::releaseWheel(&a); // clears b's grab as well
    QCOMPARE(ZuWheelGrabber::grabObject(), nullptr);
    sendWheel(&underPointer);
    QCOMPARE(underPointer.count(QEvent::Wheel), 2);

    ZuWheelGrabber::grabWheel(b);
    delete b; // a destroyed grabber ends the grab
    QCOMPARE(ZuWheelGrabber::grabObject(), nullptr);
    sendWheel(&underPointer);
    QCOMPARE(underPointer.count(QEvent::Wheel), 3);

    ZuWheelGrabber::grabWheel(&a);
    ZuWheelGrabber::grabWheel(nullptr);
    QCOMPARE(ZuWheelGrabber::grabObject(), nullptr);
}

void TestApplication::busyNesting()
{
    auto shape = [] {
        const QCursor* cursor = QGuiApplication::overrideCursor();
        return cursor ? int(cursor->shape()) : -1;
    };
    QCOMPARE(shape(), -1);
    {
        ZuApplication::Busy idle(false); // outside a busy phase: nothing
        QCOMPARE(shape(), -1);
    }
    QCOMPARE(shape(), -1);
    {
        ZuApplication::Busy busy(true);
        QCOMPARE(shape(), int(Qt::WaitCursor));
        {
            ZuApplication::Busy modal(false);
            QCOMPARE(shape(), int(Qt::ArrowCursor));
            {
                ZuApplication::Busy inner(true);
                QCOMPARE(shape(), int(Qt::WaitCursor));
            }
            QCOMPARE(shape(), int(Qt::ArrowCursor));
        }
        QCOMPARE(shape(), int(Qt::WaitCursor));
    }
    QCOMPARE(shape(), -1);
}

void TestApplication::flushPendingEvents()
{
    // A finite chain is delivered completely.
    Reposter finite;
    finite.repost = 6;
    QCoreApplication::postEvent(&finite, new QEvent(sTestEvent));
    ZuApplication::flushPendingEvents();
    QCOMPARE(finite.delivered, 6);

    // Events that keep posting new ones: the flush gives up after its passes.
    Reposter endless;
    QCoreApplication::postEvent(&endless, new QEvent(sTestEvent));
    ZuApplication::flushPendingEvents();
    const int afterFlush = endless.delivered;
    QVERIFY2(afterFlush >= 19 && afterFlush <= 3 * 19, qPrintable(QString::number(afterFlush)));
    endless.repost = 0; // let the last posted event end the chain
    QTRY_COMPARE(endless.delivered, afterFlush + 1);
}

void TestApplication::defaultParentSplashAbout()
{
    ZuApplication* app = ZuApplication::instance();
    QCOMPARE(app->defaultParentProvider().defaultParent(), nullptr);

    struct Provider : ZuApplication::DefaultParentProvider
    {
        QWidget* widget = nullptr;
        QWidget* defaultParent() const override { return widget; }
    };
    QWidget window;
    auto* provider = new Provider;
    provider->widget = &window;
    app->setDefaultParentProvider(provider);
    QCOMPARE(app->defaultParentProvider().defaultParent(), &window);
    app->setDefaultParentProvider(nullptr);
    QCOMPARE(app->defaultParentProvider().defaultParent(), nullptr);

    QPixmap pixmap(40, 20);
    pixmap.fill(Qt::blue);
    QPointer<QSplashScreen> first = new QSplashScreen(pixmap);
    app->setSplashScreen(first);
    QVERIFY(first->isVisible());
    QPointer<QSplashScreen> second = new QSplashScreen(pixmap);
    app->setSplashScreen(second);
    QVERIFY(first.isNull());
    QVERIFY(second->isVisible());
    app->setSplashScreen(nullptr);
    QVERIFY(second.isNull());

    AboutReceiver one, two;
    app->connectShowAbout(&one, SLOT(about()));
    app->showAbout();
    app->connectShowAbout(&two, SLOT(about()));
    app->showAbout();
    QCOMPARE(one.hits, 1);
    QCOMPARE(two.hits, 1);
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
    if (arguments.isEmpty()) {
        QCOMPARE(spy.count(), 0);
        QVERIFY(!QFileInfo::exists(record));
        return;
    }
    QCOMPARE(spy.count(), 1);
    QTRY_VERIFY_WITH_TIMEOUT(QFileInfo::exists(record), 10000);
    QFile recorded(record);
    QVERIFY(recorded.open(QIODevice::ReadOnly));
    QStringList got = QString::fromLocal8Bit(recorded.readAll()).split('\n');
    QCOMPARE(got.takeLast(), QString());
    QCOMPARE(got, arguments);
}

void TestApplication::deferredDeleteNestedLoop()
{
    // A dialog is to be deleted from inside a nested loop that runs in the click handler of one
    // of its buttons: the deletion waits until the button's handler has returned.
    RkLogCapture capture;
    auto* dialog = new QDialog;
    dialog->setObjectName(QStringLiteral("dialog"));
    auto* button = new QPushButton(QStringLiteral("Go"), dialog);
    button->setObjectName(QStringLiteral("button"));
    button->resize(80, 30);
    dialog->show();
    QPointer<QDialog> guard(dialog);

    int buttonLevel = -1;
    int deleteLevel = -1;
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
    QVERIFY(!guard.isNull());
    QTRY_VERIFY(guard.isNull());

    const QString expected =
        QStringLiteral("4 deletion of [%1 dialog] in level [%2] would also delete [%3 button] "
                       "which is still processing an event in level [%4]")
            .arg(pointerText(dialog))
            .arg(deleteLevel)
            .arg(pointerText(button))
            .arg(buttonLevel);
    QCOMPARE(deferredDeleteLines(capture), QStringList(expected));
}

void TestApplication::deferredDeleteGrandchild()
{
    RkLogCapture capture;
    auto* parent = new Receiver(QStringLiteral("parent"));
    auto* first = new Receiver(QStringLiteral("first"), parent);
    new Receiver(QStringLiteral("firstChild"), first);
    auto* second = new Receiver(QStringLiteral("second"), parent);
    auto* grandchild = new Receiver(QStringLiteral("grandchild"), second);
    new Receiver(QStringLiteral("after"), grandchild);
    QPointer<QObject> guard(parent);

    int grandchildLevel = -1;
    int deleteLevel = -1;
    bool aliveInHandler = false;
    grandchild->onTestEvent = [&] {
        grandchildLevel = ZuApplication::callDepth_of_notify() - 1;
        deleteLevel = ZuApplication::callDepth_of_notify();
        parent->deleteLater();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        aliveInHandler = !guard.isNull();
    };
    sendTestEvent(grandchild);
    QVERIFY(aliveInHandler);
    QTRY_VERIFY(guard.isNull());
    QCOMPARE(deferredDeleteLines(capture),
             QStringList(QStringLiteral("4 deletion of [%1 parent] in level [%2] would also delete "
                                        "[%3 grandchild] which is still processing an event in "
                                        "level [%4]")
                             .arg(pointerText(parent))
                             .arg(deleteLevel)
                             .arg(pointerText(grandchild))
                             .arg(grandchildLevel)));

    // Nobody of the tree busy: deleted at once, nothing logged.
    capture.clear();
    QPointer<QObject> free = new Receiver(QStringLiteral("free"));
    free->deleteLater();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(free.isNull());
    QCOMPARE(deferredDeleteLines(capture), QStringList());
}

// Runs last: the report counter is process-wide and the earlier tests used two reports.
void TestApplication::deferredDeleteReportCap()
{
    RkLogCapture capture;
    const RkLogLevel outputLevel = getTheLogInstance().outputLevel();
    getTheLogInstance().setOutputLevel(RkLogOff);
    auto* busy = new Receiver(QStringLiteral("busy"));
    QPointer<QObject> guard(busy);
    int attempts = 0;
    bool aliveInHandler = false;
    busy->onTestEvent = [&] {
        // Every attempt is postponed; only the first 5000 of the process are reported.
        busy->deleteLater();
        for (attempts = 0; attempts < 5000; ++attempts)
            QCoreApplication::sendPostedEvents(busy, QEvent::DeferredDelete);
        aliveInHandler = !guard.isNull();
    };
    sendTestEvent(busy);
    getTheLogInstance().setOutputLevel(outputLevel);
    QVERIFY(aliveInHandler);
    QTRY_VERIFY(guard.isNull());
    QCOMPARE(deferredDeleteLines(capture).size(), 5000 - 2);
}

int main(int argc, char** argv)
{
    ZuApplication* app = ZuApplication::createInstance(argc, argv, sEnvp);
    if (!app)
        return 1;
    TestApplication test;
    const int result = QTest::qExec(&test, argc, argv);
    delete app;
    return result;
}

#include "tst_application.moc"
