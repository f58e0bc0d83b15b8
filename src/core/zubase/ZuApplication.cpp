#include "zubase/ZuApplication.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/ZuWheelGrabber.h"

#include <QAbstractEventDispatcher>
#include <QEvent>
#include <QProcess>
#include <QSplashScreen>
#include <QThread>
#include <QUrl>
#include <QX11Info>

#include <algorithm>
#include <cinttypes>
#include <cstdint>
#include <cstdlib>
#include <utility>
#include <vector>

#ifdef Q_OS_UNIX
#include <pthread.h>
#endif

namespace {

// Receivers of the notify() calls active on the main thread, outermost first. A plain array
// so that the dispatch fast path is a store and an increment; it only grows.
struct NotifyStack
{
    QObject** data = nullptr;
    int size = 0;
    int capacity = 0;

    void push(QObject* inObject)
    {
        if (Q_UNLIKELY(size == capacity))
            grow();
        data[size++] = inObject;
    }
    void grow()
    {
        const int newCapacity = capacity ? capacity * 2 : 64;
        auto* newData = static_cast<QObject**>(std::realloc(data, sizeof(QObject*) * newCapacity));
        Q_CHECK_PTR(newData);
        data = newData;
        capacity = newCapacity;
    }
};

NotifyStack sNotifyStack;
Qt::HANDLE sMainThreadId = nullptr;
ZuApplication::HookNotify* sHooks[3] = {nullptr, nullptr, nullptr};
// Any slot filled: one test instead of three on the path of every event.
bool sAnyHook = false;
int sDeferredDeleteReports = 0;
const int sMaxDeferredDeleteReports = 5000;

inline Qt::HANDLE currentThreadHandle()
{
#ifdef Q_OS_UNIX
    // What QThread::currentThreadId() returns here, without the detour through QtCore.
    return reinterpret_cast<Qt::HANDLE>(pthread_self());
#else
    return QThread::currentThreadId();
#endif
}

inline bool onMainThread()
{
    return !sMainThreadId || currentThreadHandle() == sMainThreadId;
}

void updateAnyHook()
{
    sAnyHook = sHooks[0] || sHooks[1] || sHooks[2];
}

Q_NEVER_INLINE void callBeforeHooks(QObject* inReceiver, QEvent* inEvent)
{
    // The table is read afresh for every slot: a hook may remove itself or another one.
    for (int i = 0; i < 3; ++i) {
        if (ZuApplication::HookNotify* hook = sHooks[i])
            hook->beforeNotify(inReceiver, inEvent);
    }
}

Q_NEVER_INLINE void callAfterHooks(QObject* inReceiver, QEvent* inEvent)
{
    for (int i = 2; i >= 0; --i) {
        if (ZuApplication::HookNotify* hook = sHooks[i])
            hook->afterNotify(inReceiver, inEvent);
    }
}

// QObject keeps a "deleteLater() was called" flag and drops a further deferred delete while
// the flag is set and other events are pending for the object. The postponed deletion is
// swallowed here without deleting the object, so the flag has to go before re-posting, or the
// deletion would be lost.
struct DeleteLaterFlag : QObject
{
    static void clear(QObject* inObject)
    {
        (inObject->*(&DeleteLaterFlag::d_ptr))->deleteLaterCalled = false;
    }
};

// Whether deleting inReceiver now would destroy an object that is still handling an event
// further down the notify stack. Walks the receiver's tree depth first, pre-order; each object
// is looked up in a sorted copy of the stack, so the cost is linear in the size of the tree.
Q_NEVER_INLINE bool deferredDeleteMustWait(QObject* inReceiver, QEvent* inEvent)
{
    if (sNotifyStack.size == 0)
        return false;

    // (object, lowest stack index), sorted by object and then index.
    std::vector<std::pair<QObject*, int>> active;
    active.reserve(static_cast<size_t>(sNotifyStack.size));
    for (int i = 0; i < sNotifyStack.size; ++i)
        active.emplace_back(sNotifyStack.data[i], i);
    std::sort(active.begin(), active.end());

    auto levelOf = [&active](QObject* inObject) {
        const auto it =
            std::lower_bound(active.begin(), active.end(), std::make_pair(inObject, -1));
        return (it != active.end() && it->first == inObject) ? it->second : -1;
    };

    QObject* found = nullptr;
    int foundLevel = -1;
    std::vector<QObject*> pending{inReceiver};
    while (!pending.empty()) {
        QObject* object = pending.back();
        pending.pop_back();
        foundLevel = levelOf(object);
        if (foundLevel >= 0) {
            found = object;
            break;
        }
        const QObjectList& children = object->children();
        for (auto it = children.crbegin(); it != children.crend(); ++it)
            pending.push_back(*it);
    }
    if (!found)
        return false;

    if (sDeferredDeleteReports < sMaxDeferredDeleteReports) {
        // Pointers are written as 0x and hex digits; glibc's %p would add its own 0x.
        getTheLogInstance().tracef(
            RkLogFatal, "DeferredDelete",
            "deletion of [0x%" PRIxPTR " %s] in level [%d] would also delete [0x%" PRIxPTR
            " %s] which is still processing an event in level [%d]",
            reinterpret_cast<uintptr_t>(inReceiver), Q2M(inReceiver->objectName()).constData(),
            sNotifyStack.size, reinterpret_cast<uintptr_t>(found),
            Q2M(found->objectName()).constData(), foundLevel);
        ++sDeferredDeleteReports;
    }
    inEvent->accept();
    DeleteLaterFlag::clear(inReceiver);
    inReceiver->deleteLater();
    return true;
}

// Pops the notify stack also when an event handler throws through notify().
struct NotifyStackPop
{
    bool active;
    ~NotifyStackPop()
    {
        if (active)
            --sNotifyStack.size;
    }
};

} // namespace

ZuApplication::DefaultParentProvider::~DefaultParentProvider() = default;

QWidget* ZuApplication::DefaultParentProvider::defaultParent() const
{
    return nullptr;
}

ZuApplication::HookNotify::~HookNotify() = default;

ZuApplication::Busy::Busy(bool inBusy)
{
    if (inBusy) {
        QGuiApplication::setOverrideCursor(busyCursor());
        mActive = true;
    } else if (QGuiApplication::overrideCursor()) {
        // A modal interaction inside a busy phase shows the normal arrow.
        QGuiApplication::setOverrideCursor(QCursor(Qt::ArrowCursor));
        mActive = true;
    }
}

ZuApplication::Busy::~Busy()
{
    if (mActive)
        QGuiApplication::restoreOverrideCursor();
}

ZuApplication::Busy& ZuApplication::Busy::operator=(const Busy& inOther)
{
    mActive = inOther.mActive;
    return *this;
}

ZuApplication* ZuApplication::createInstance(int& argc, char** argv, char** envp)
{
    if (!QCoreApplication::instance())
        new ZuApplication(argc, argv, envp);
    return instance();
}

ZuApplication* ZuApplication::instance()
{
    return qobject_cast<ZuApplication*>(QCoreApplication::instance());
}

ZuApplication::ZuApplication(int& argc, char** argv, char** envp)
    : QApplication(argc, argv), mAboutAction(this)
{
    sMainThreadId = currentThreadHandle();
    if (sNotifyStack.capacity == 0)
        sNotifyStack.grow();

    if (envp && envp[0]) {
        for (char** entry = envp; *entry; ++entry) {
            const QString text = QString::fromLatin1(*entry);
            const int equals = text.indexOf(QLatin1Char('='));
            // Entries without a name (the "=C:=C:\..." drive entries of Windows) are skipped.
            if (equals > 0)
                mEnvironment.insert(text.left(equals), text.mid(equals + 1));
        }
    }
    // The palette comes from the colour schemes, not from the desktop.
    QGuiApplication::setDesktopSettingsAware(false);
}

ZuApplication::~ZuApplication() = default;

bool ZuApplication::isMainThread()
{
    return onMainThread();
}

int ZuApplication::callDepth_of_notify()
{
    return sNotifyStack.size;
}

bool ZuApplication::notify(QObject* inReceiver, QEvent* inEvent)
{
    const QEvent::Type type = inEvent->type();
    const bool mainThread = onMainThread();
    if (mainThread) {
        if (Q_UNLIKELY(type == QEvent::DeferredDelete) &&
            deferredDeleteMustWait(inReceiver, inEvent))
            return true;
        sNotifyStack.push(inReceiver);
    }
    NotifyStackPop pop{mainThread};

    if (Q_UNLIKELY(sAnyHook))
        callBeforeHooks(inReceiver, inEvent);

    QObject* target = inReceiver;
    if (Q_UNLIKELY(type == QEvent::Wheel)) {
        if (QObject* grabber = ZuWheelGrabber::grabObject())
            target = grabber;
    }
    const bool result = n_______________________________________(target, inEvent);

    if (Q_UNLIKELY(sAnyHook))
        callAfterHooks(inReceiver, inEvent);
    return result;
}

bool ZuApplication::n_______________________________________(QObject* inReceiver, QEvent* inEvent)
{
    return QApplication::notify(inReceiver, inEvent);
}

bool ZuApplication::event(QEvent* inEvent)
{
    return QApplication::event(inEvent);
}

void ZuApplication::installHookNotify(HookNotify* inHook)
{
    if (!inHook)
        return;
    for (HookNotify* hook : sHooks) {
        if (hook == inHook)
            return;
    }
    for (HookNotify*& slot : sHooks) {
        if (!slot) {
            slot = inHook;
            break;
        }
    }
    updateAnyHook();
}

void ZuApplication::deInstallHookNotify(HookNotify* inHook)
{
    if (!inHook)
        return;
    for (HookNotify*& slot : sHooks) {
        if (slot == inHook) {
            slot = nullptr;
            break;
        }
    }
    updateAnyHook();
}

const ZuApplication::DefaultParentProvider& ZuApplication::defaultParentProvider()
{
    if (!mDefaultParentProvider)
        mDefaultParentProvider = std::make_unique<DefaultParentProvider>();
    return *mDefaultParentProvider;
}

void ZuApplication::setDefaultParentProvider(DefaultParentProvider* inProvider)
{
    mDefaultParentProvider.reset(inProvider);
}

void ZuApplication::setSplashScreen(QSplashScreen* inSplash)
{
    if (inSplash == mSplashScreen.get())
        return;
    mSplashScreen.reset(inSplash);
    if (inSplash) {
        inSplash->show();
        QCoreApplication::processEvents();
    }
}

void ZuApplication::connectShowAbout(const QObject* inReceiver, const char* inMember)
{
    QObject::disconnect(&mAboutAction, nullptr, nullptr, nullptr);
    QObject::connect(&mAboutAction, SIGNAL(triggered()), inReceiver, inMember);
}

void ZuApplication::showAbout()
{
    mAboutAction.trigger();
}

const QHash<QString, QString>& ZuApplication::environment() const
{
    return mEnvironment;
}

QString ZuApplication::environmentLookup(const QString& inName) const
{
    const auto it = mEnvironment.constFind(inName);
    return it == mEnvironment.constEnd() ? QString() : it.value();
}

void ZuApplication::flushPendingEvents()
{
    for (int pass = 0; pass < 19; ++pass) {
        QAbstractEventDispatcher* dispatcher = QAbstractEventDispatcher::instance();
        if (!dispatcher || !dispatcher->hasPendingEvents())
            break;
        QCoreApplication::sendPostedEvents(nullptr, 0);
        QCoreApplication::processEvents(QEventLoop::AllEvents);
    }
}

QCursor ZuApplication::busyCursor()
{
    return QCursor(Qt::WaitCursor);
}

void ZuApplication::handleFileOpenEvent(const QString& inFile, const QUrl& inUrl)
{
    // Program and arguments travel as a list, so that blanks in a file name or a URL cannot
    // split it into several arguments or add arguments of their own.
    const QString program = QCoreApplication::applicationDirPath() + QStringLiteral("/tzcontrol");
    QStringList arguments;
    if (!inFile.isEmpty()) {
        arguments << QStringLiteral("--cfgfile") << inFile;
    } else if (inUrl.isEmpty()) {
        return;
    } else {
        arguments << inUrl.toString().replace(QLatin1Char(' '), QStringLiteral("%20"));
    }

    auto* process = new QProcess;
    process->setReadChannel(QProcess::StandardError);
    QObject::connect(process, QOverload<int, QProcess::ExitStatus>::of(&QProcess::finished),
                     process, &QObject::deleteLater);
    // A program that never starts never finishes either; do not keep its object forever.
    QObject::connect(process, &QProcess::errorOccurred, process,
                     [process](QProcess::ProcessError inError) {
                         if (inError == QProcess::FailedToStart)
                             process->deleteLater();
                     });
    process->start(program, arguments, QIODevice::ReadWrite);
    emit protocolHandlerCalled();
}

// X11 last: its headers define macros (None, Bool, Status ...) that clash with Qt's.
#include <X11/Xlib.h>

Qt::MouseButtons ZuApplication::mouseButtons2()
{
    if (QX11Info::isPlatformX11()) {
        if (Display* display = QX11Info::display()) {
            Window root = 0;
            Window child = 0;
            int rootX = 0, rootY = 0, windowX = 0, windowY = 0;
            unsigned int mask = 0;
            if (XQueryPointer(display, DefaultRootWindow(display), &root, &child, &rootX, &rootY,
                              &windowX, &windowY, &mask)) {
                Qt::MouseButtons buttons;
                if (mask & Button1Mask)
                    buttons |= Qt::LeftButton;
                if (mask & Button3Mask)
                    buttons |= Qt::RightButton;
                if (mask & Button2Mask)
                    buttons |= Qt::MiddleButton;
                return buttons;
            }
        }
    }
    // No window system to ask: the state Qt saw last is the closest we have.
    return QGuiApplication::mouseButtons();
}
