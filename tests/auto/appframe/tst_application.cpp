// The application object (environment, dispatch with hooks and wheel grab, postponed deletions,
// busy cursor, flushing, splash screen, about action, protocol handler) and the helpers that
// live with it: the scoped connection and sizing a widget to a scroll area's viewport.
#include "zubase/ZuApplication.h"
#include "zubase/ZuConvert.h"
#include "zubase/ZuScopedConnection.h"
#include "zubase/ZuWheelGrabber.h"

#include "TestSupport.h"

#include <QProcess>
#include <QScrollArea>
#include <QSplashScreen>
#include <QTemporaryDir>
#include <QThread>
#include <QUrl>
#include <QVBoxLayout>

#include <ctime>
#include <functional>

namespace {

const QEvent::Type kTestEvent = QEvent::Type(QEvent::User + 1);

// Writes "<name>.before<receiver's name>" and ".after" for test and wheel events.
struct RecordingHook : ZuApplication::HookNotify
{
    RecordingHook(QChar inName, QStringList& ioCalls) : name(inName), calls(ioCalls) {}
    void beforeNotify(QObject* inReceiver, QEvent* inEvent) override
    {
        record(".before", inReceiver, inEvent);
        if (removeSelf && inEvent->type() == kTestEvent)
            ZuApplication::deInstallHookNotify(this);
    }
    void afterNotify(QObject* inReceiver, QEvent* inEvent) override
    {
        record(".after", inReceiver, inEvent);
    }
    void record(const char* inPhase, QObject* inReceiver, QEvent* inEvent)
    {
        if (inEvent->type() == kTestEvent || inEvent->type() == QEvent::Wheel)
            calls << name + inPhase + inReceiver->objectName();
    }
    QString name;
    QStringList& calls;
    bool removeSelf = false;
};

// Counts test and wheel events and runs onTest inside each test event; with repost it posts
// itself the next test event from each one.
struct Receiver : QObject
{
    using QObject::QObject;
    bool event(QEvent* inEvent) override
    {
        if (inEvent->type() == QEvent::Wheel)
            return ++wheels;
        if (inEvent->type() != kTestEvent)
            return QObject::event(inEvent);
        ++tests;
        if (onTest)
            onTest();
        if (repost)
            QCoreApplication::postEvent(this, new QEvent(kTestEvent));
        return true;
    }
    int wheels = 0;
    int tests = 0;
    bool repost = false;
    std::function<void()> onTest;
};

void sendTestEvent(QObject* inReceiver)
{
    QEvent event(kTestEvent);
    QCoreApplication::sendEvent(inReceiver, &event);
}

struct FileOpenAccess : ZuApplication
{
    // Reaches the protected handler through a member pointer; no object of this class exists.
    static void handle(const QString& inFile, const QUrl& inUrl)
    {
        (instance()->*(&FileOpenAccess::handleFileOpenEvent))(inFile, inUrl);
    }
};

struct FixedHintWidget : QWidget
{
    QSize sizeHint() const override { return QSize(420, 260); }
};

// main() hands these to createInstance().
char sEnv[][32] = {
    "ZU_NAME=value=with=equals", "=C:=C:\\work",       "ZU_EMPTY=", "ZU_NOEQUALS", "ZU_TWICE=first",
    "ZU_TWICE=second",           "ZU_LATIN1=\xe9t\xe9"};
char* sEnvp[] = {sEnv[0], sEnv[1], sEnv[2], sEnv[3], sEnv[4], sEnv[5], sEnv[6], nullptr};

} // namespace

class TestApplication : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void initTestCase();
    void cleanupTestCase() { getTheLogInstance().removeSink(mReportSink); }
    void mainThreadAndDepth();
    void environment();
    void hooks();
    void wheelGrab();
    void busyNesting();
    void flushPendingEvents();
    void splashScreen();
    void about();
    void protocolHandler_data();
    void protocolHandler();
    void obstructedDeletionWaits();
    void deferredDeleteReportCap();
    void scopedConnection();
    void resizeWidgetToViewport();

public Q_SLOTS:
    void aboutShown() { ++mAboutShown; }

private:
    int mAboutShown = 0;
    // Every "DeferredDelete" report of the process: the cap counts them all.
    std::atomic<int> mReports{0};
    int mReportSink = -1;
};

void TestApplication::initTestCase()
{
    mReportSink = getTheLogInstance().addSink(
        [this](const RkLogEntry& inEntry) { mReports += inEntry.category == "DeferredDelete"; });
}

void TestApplication::mainThreadAndDepth()
{
    int argc = 1;
    char* argv[] = {sEnv[3], nullptr};
    QCOMPARE(ZuApplication::createInstance(argc, argv, nullptr), ZuApplication::instance());
    bool workerIsMain = true;
    std::unique_ptr<QThread> worker(
        QThread::create([&] { workerIsMain = ZuApplication::isMainThread(); }));
    worker->start();
    QVERIFY(worker->wait(10000));
    QVERIFY(ZuApplication::isMainThread() && !workerIsMain);
    // Each handler sees its own level of the notify stack.
    Receiver outer, inner;
    QList<int> depths;
    inner.onTest = [&] {
        depths << ZuApplication::callDepth_of_notify();
    };
    outer.onTest = [&] {
        depths << ZuApplication::callDepth_of_notify();
        sendTestEvent(&inner);
    };
    sendTestEvent(&outer);
    QCOMPARE(depths, QList<int>({1, 2}));
    QCOMPARE(ZuApplication::callDepth_of_notify(), 0);
}

void TestApplication::environment()
{
    // Entries without '=' or with an empty name are skipped; the later of two entries wins.
    const ZuApplication* app = ZuApplication::instance();
    QCOMPARE(app->environment().keys().size(), 4);
    const QList<QPair<QString, QString>> lookups = {
        {"ZU_NAME", "value=with=equals"}, {"ZU_EMPTY", ""},
        {"ZU_NOEQUALS", QString()},       {"=C:", QString()},
        {"zu_name", QString()},           {"ZU_TWICE", "second"},
        {"ZU_LATIN1", "\u00e9t\u00e9"}};
    for (const auto& [name, value] : lookups) {
        QCOMPARE(app->environmentLookup(name), value);
        QCOMPARE(app->environmentLookup(name).isNull(), value.isNull());
    }
}

void TestApplication::hooks()
{
    QStringList calls;
    std::vector<std::unique_ptr<RecordingHook>> h;
    for (QChar name : QStringLiteral("abcde"))
        h.emplace_back(new RecordingHook(name, calls));
    Receiver receiver;
    QStringList seenInHandler;
    receiver.onTest = [&] {
        seenInHandler = calls;
    };
    auto dispatch = [&] {
        calls.clear();
        sendTestEvent(&receiver);
        return calls.join(' ');
    };
    for (int i : {0, 0, 1, 2, 3}) // one slot per hook; the fourth is dropped
        ZuApplication::installHookNotify(h[i].get());
    QCOMPARE(dispatch(), QStringLiteral("a.before b.before c.before c.after b.after a.after"));
    QCOMPARE(seenInHandler.join(' '), QStringLiteral("a.before b.before c.before"));
    // b removes itself during dispatch: no after-call, the others keep their places.
    h[1]->removeSelf = true;
    QCOMPARE(dispatch(), QStringLiteral("a.before b.before c.before c.after a.after"));
    ZuApplication::deInstallHookNotify(h[0].get()); // slot 0 free, c stays in slot 2
    ZuApplication::deInstallHookNotify(h[4].get()); // not installed: ignored
    QCOMPARE(dispatch(), QStringLiteral("c.before c.after"));
    ZuApplication::installHookNotify(h[3].get()); // first free slot: 0
    ZuApplication::installHookNotify(h[4].get()); // then slot 1
    QCOMPARE(dispatch(), QStringLiteral("d.before e.before c.before c.after e.after d.after"));
    for (auto& hook : h)
        ZuApplication::deInstallHookNotify(hook.get());
}

void TestApplication::wheelGrab()
{
    QStringList calls;
    RecordingHook hook('h', calls);
    ZuApplication::installHookNotify(&hook);
    Receiver underPointer, a;
    underPointer.setObjectName(QStringLiteral(" under"));
    auto* b = new Receiver;
    auto wheel = [&] {
        QWheelEvent event(QPointF(5, 5), QPointF(5, 5), QPoint(), QPoint(0, 120), Qt::NoButton,
                          Qt::NoModifier, Qt::NoScrollPhase, false);
        QCoreApplication::sendEvent(&underPointer, &event);
    };
    ZuWheelGrabber::grabWheel(&a);
    ZuWheelGrabber::grabWheel(b); // b takes the grab from a
    wheel();
    sendTestEvent(&underPointer); // other events are not redirected
    ZuApplication::deInstallHookNotify(&hook);
    QCOMPARE(QList<int>({b->wheels, a.wheels, underPointer.wheels, underPointer.tests}),
             QList<int>({1, 0, 0, 1}));
    // The hooks see the receiver that was asked for, not the grabber.
    QCOMPARE(calls.mid(0, 2), QStringList({"h.before under", "h.after under"}));
    ZuWheelGrabber::releaseWheel(&a); // clears b's grab as well
    wheel();
    ZuWheelGrabber::grabWheel(b);
    delete b; // a destroyed grabber ends the grab
    wheel();
    QCOMPARE(underPointer.wheels, 2);
}

void TestApplication::busyNesting()
{
    // Outside a busy phase a modal phase changes nothing; inside one it shows the arrow.
    QList<int> shapes;
    std::vector<std::unique_ptr<ZuApplication::Busy>> stack;
    for (int step = 0; step < 8; ++step) {
        if (step < 4)
            stack.emplace_back(new ZuApplication::Busy(step % 2));
        else
            stack.pop_back();
        const QCursor* cursor = QGuiApplication::overrideCursor();
        shapes << (cursor ? int(cursor->shape()) : -1);
    }
    const int wait = Qt::WaitCursor, arrow = Qt::ArrowCursor;
    QCOMPARE(shapes, QList<int>({-1, wait, arrow, wait, arrow, wait, -1, -1}));
}

void TestApplication::flushPendingEvents()
{
    // An event that always posts the next one: each of the 19 passes delivers the posted event
    // and, while processing, the one it posted in turn.
    Receiver endless;
    endless.repost = true;
    QCoreApplication::postEvent(&endless, new QEvent(kTestEvent));
    ZuApplication::flushPendingEvents();
    QCOMPARE(endless.tests, 2 * 19);
    endless.repost = false;
    QTRY_COMPARE(endless.tests, 2 * 19 + 1);
}

void TestApplication::splashScreen()
{
    ZuApplication* app = ZuApplication::instance();
    QPixmap pixmap(30, 20);
    QPointer<QSplashScreen> first = new QSplashScreen(pixmap);
    app->setSplashScreen(first);
    QVERIFY(first->isVisible());
    QPointer<QSplashScreen> second = new QSplashScreen(pixmap);
    app->setSplashScreen(second); // replaces and deletes the first
    app->setSplashScreen(second); // handed in again: kept
    QVERIFY(first.isNull() && !second.isNull());
    // The host deletes its splash itself; closing it later must not delete it again.
    delete second;
    app->setSplashScreen(nullptr);
    app->setSplashScreen(new QSplashScreen(pixmap)); // owned as before, deleted at the end
}

void TestApplication::about()
{
    QAction earlier(nullptr);
    QSignalSpy earlierSpy(&earlier, &QAction::triggered);
    ZuApplication::instance()->connectShowAbout(&earlier, SLOT(trigger()));
    ZuApplication::instance()->connectShowAbout(this, SLOT(aboutShown())); // drops the earlier
    ZuApplication::instance()->showAbout();
    QCOMPARE(QList<int>({mAboutShown, earlierSpy.count()}), QList<int>({1, 0}));
}

void TestApplication::protocolHandler_data()
{
    QTest::addColumn<QString>("file");
    QTest::addColumn<QString>("url");
    QTest::addColumn<QStringList>("arguments"); // empty: nothing is started
    QTest::newRow("nothing") << QString() << QString() << QStringList();
    QTest::newRow("file with blanks and quotes, url ignored")
        << "/data/my studies/a\" --evil \"b.cfg"
        << "tessel://ignored" << QStringList({"--cfgfile", "/data/my studies/a\" --evil \"b.cfg"});
    QTest::newRow("url with blanks")
        << QString() << "tessel://open?patient=John Doe&study=1 2"
        << QStringList({"tessel://open?patient=John%20Doe&study=1%202"});
    QTest::newRow("program missing") << "x.cfg" << QString() << QStringList("missing");
}

void TestApplication::protocolHandler()
{
    // The control program gets its arguments as given; its process object reads standard error
    // and goes away once the program has ended, or could not start.
    QFETCH(QString, file);
    QFETCH(QString, url);
    QFETCH(QStringList, arguments);
    QTemporaryDir dir;
    const QString record = dir.filePath(QStringLiteral("arguments.txt"));
    qputenv("ZU_TZCONTROL_RECORD", QFile::encodeName(record));
    const QString program = QCoreApplication::applicationDirPath() + QStringLiteral("/tzcontrol");
    const bool missing = arguments == QStringList("missing");
    if (!QFileInfo::exists(program)) // a run stopped before it could put it back
        QFile::rename(program + ".away", program);
    QFile::remove(program + ".away"); // and a rebuild put a new one in its place
    QVERIFY(!missing || QFile::rename(program, program + ".away"));
    const auto restore = qScopeGuard([&] { missing&& QFile::rename(program + ".away", program); });
    struct ProcessWatch : ZuApplication::HookNotify
    {
        void beforeNotify(QObject* inReceiver, QEvent* inEvent) override
        {
            if (auto* process = qobject_cast<QProcess*>(inReceiver)) {
                stdoutRead |= process->readChannel() == QProcess::StandardOutput;
                deleted += inEvent->type() == QEvent::DeferredDelete;
            }
        }
        void afterNotify(QObject*, QEvent*) override {}
        bool stdoutRead = false;
        int deleted = 0;
    } watch;
    ZuApplication::installHookNotify(&watch);
    const auto uninstall = qScopeGuard([&] { ZuApplication::deInstallHookNotify(&watch); });
    QSignalSpy spy(ZuApplication::instance(), &ZuApplication::protocolHandlerCalled);
    FileOpenAccess::handle(file, url.isEmpty() ? QUrl() : QUrl(url));
    QCOMPARE(spy.count(), arguments.isEmpty() ? 0 : 1);
    QTest::qWait(arguments.isEmpty() ? 200 : 0);
    QTRY_COMPARE_WITH_TIMEOUT(watch.deleted, arguments.isEmpty() ? 0 : 1, 10000);
    QVERIFY(!watch.stdoutRead);
    QFile recorded(record);
    QCOMPARE(recorded.open(QIODevice::ReadOnly), !arguments.isEmpty() && !missing);
    if (recorded.isOpen())
        QCOMPARE(QString::fromLocal8Bit(recorded.readAll()), arguments.join('\n') + '\n');
}

void TestApplication::obstructedDeletionWaits()
{
    // A tree is to be deleted while a child runs a nested loop and a grandchild further down
    // the stack is busy too: the deletion waits, idle, for both, with one report though the
    // host asks again. A tree nobody of which is busy goes at once.
    RkLogCapture capture;
    QPointer<Receiver> parent = new Receiver;
    const void* parentAddress = parent.data();
    parent->setObjectName(QStringLiteral("window"));
    new Receiver(parent); // a sibling before the busy branch
    auto* child = new Receiver(new Receiver(parent));
    child->setObjectName(QStringLiteral("button"));
    auto* grandchild = new Receiver(new Receiver(parent));
    int depth = -1;
    double cpu = -1;
    QList<bool> alive;
    child->onTest = [&] {
        depth = ZuApplication::callDepth_of_notify();
        for (int attempt = 0; attempt < 2; ++attempt) {
            parent->deleteLater();
            QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        }
        QEventLoop loop; // stands for a modal dialog held open for a moment
        QTimer::singleShot(500, &loop, &QEventLoop::quit);
        const std::clock_t start = std::clock();
        loop.exec();
        cpu = double(std::clock() - start) / CLOCKS_PER_SEC;
        alive << !parent.isNull();
    };
    grandchild->onTest = [&] {
        sendTestEvent(child);
        QCoreApplication::processEvents(); // the child has returned, the grandchild has not
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        alive << !parent.isNull();
    };
    sendTestEvent(grandchild);
    QCOMPARE(alive, QList<bool>({true, true}));
    QVERIFY2(cpu < 0.05, qPrintable(QStringLiteral("%1 s of CPU while waiting").arg(cpu)));
    QTRY_VERIFY(parent.isNull());
    const auto hex = [](const void* inPointer) {
        return QString::number(quintptr(inPointer), 16);
    };
    QCOMPARE(TestSupport::logLines(capture, "DeferredDelete", RkLogFatal),
             QStringList(QStringLiteral("deletion of [0x%1 window] in level [%2] would also "
                                        "delete [0x%3 button] which is still processing an event "
                                        "in level [%4]")
                             .arg(hex(parentAddress))
                             .arg(depth)
                             .arg(hex(child))
                             .arg(depth - 1)));
    QPointer<Receiver> idle = new Receiver;
    new Receiver(idle);
    idle->deleteLater();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(idle.isNull());
}

void TestApplication::deferredDeleteReportCap()
{
    // Obstructed deletions until one goes unreported: the process reports 5000 in all.
    // Unreported ones are still postponed and carried out.
    const RkLogLevel outputLevel = getTheLogInstance().outputLevel();
    getTheLogInstance().setOutputLevel(RkLogOff);
    Receiver busy;
    std::vector<QPointer<QObject>> doomed;
    busy.onTest = [&] {
        for (int before = -1; doomed.size() <= 5000 && before < mReports;) {
            before = mReports;
            doomed.emplace_back(new QObject);
            busy.setParent(doomed.back()); // the busy object is in the doomed tree
            doomed.back()->deleteLater();
            QCoreApplication::sendPostedEvents(doomed.back(), QEvent::DeferredDelete);
        }
        busy.setParent(nullptr);
    };
    sendTestEvent(&busy);
    getTheLogInstance().setOutputLevel(outputLevel);
    QCOMPARE(mReports.load(), 5000);
    QVERIFY(!doomed.back().isNull());
    QTRY_VERIFY(std::all_of(doomed.begin(), doomed.end(), [](auto& p) { return p.isNull(); }));
}

void TestApplication::scopedConnection()
{
    // The connection lasts as long as one share of it does.
    QObject sender;
    int calls = 0;
    auto connect = [&] {
        return ZuScopedConnection(
            QObject::connect(&sender, &QObject::objectNameChanged, [&calls] { ++calls; }));
    };
    auto fire = [&] { // the number of connected slots
        const int before = calls;
        sender.setObjectName(sender.objectName() + QLatin1Char('x'));
        return calls - before;
    };
    connect(); // the only share goes away at once
    QCOMPARE(fire(), 0);
    ZuScopedConnection first = connect();
    ZuScopedConnection second = first;
    first.disconnect(); // drops a share only
    QCOMPARE(fire(), 1);
    second.disconnect();
    QCOMPARE(fire(), 0);
}

void TestApplication::resizeWidgetToViewport()
{
    QWidget window;
    auto* area = new QScrollArea;
    (new QVBoxLayout(&window))->addWidget(area);
    auto* content = new FixedHintWidget;
    area->setWidget(content);
    window.resize(200, 120);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    // Null pointers and an area without content leave the widget alone.
    QScrollArea empty;
    Zu::resizeWidgetToViewport(nullptr, area);
    Zu::resizeWidgetToViewport(&window, nullptr);
    Zu::resizeWidgetToViewport(&window, &empty);
    QCOMPARE(window.size(), QSize(200, 120));
    Zu::resizeWidgetToViewport(&window, area);
    QTRY_COMPARE(area->maximumViewportSize(), content->sizeHint());
}

int main(int argc, char** argv)
{
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, sEnvp));
    TestApplication test;
    return app ? QTest::qExec(&test, argc, argv) : 1;
}

#include "tst_application.moc"
