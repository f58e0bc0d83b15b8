#include "zubase/ZuApplication.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/ZuWheelGrabber.h"
#include "zubase/platform/SysInput.h"
#include "zubase/platform/SysMemory.h"
#include "zubase/platform/SysThread.h"

#include <QAbstractEventDispatcher>
#include <QEvent>
#include <QPointer>
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

namespace {

// Receivers of the notify() calls active on the main thread, outermost first.
//
// notify() runs for every event, so its push must be a store and an increment. Where the system
// lets us, the array is one reservation of address space for kReserved entries whose pages are
// only backed by memory once touched, followed by an inaccessible guard page: it grows without
// ever moving or being checked on the fast path. No thread's own stack can hold the frames of
// a million nested dispatches, so the guard page is never reached before the thread's stack
// would overflow. Otherwise it is an ordinary array that doubles when full.
struct NotifyStack
{
    QObject** base = nullptr;
    QObject** top = nullptr;
    QObject** end = nullptr;
    bool reserved = false;

    int size() const { return int(top - base); }
    void push(QObject* inObject)
    {
        if (Q_UNLIKELY(top == end))
            grow();
        *top++ = inObject;
    }
    void grow();
};

const size_t kReserved = size_t(1) << 20;

void NotifyStack::grow()
{
    const int used = size();
    if (!base) {
        if (void* memory = ZuPlatform::memoryReserveWithGuard(kReserved * sizeof(QObject*))) {
            base = top = static_cast<QObject**>(memory);
            end = base + kReserved;
            reserved = true;
            return;
        }
    }
    if (reserved)
        qFatal("ZuApplication: event dispatch nested more than %d levels", used);
    const int capacity = base ? int(end - base) * 2 : 64;
    auto* data = static_cast<QObject**>(std::realloc(base, sizeof(QObject*) * size_t(capacity)));
    Q_CHECK_PTR(data);
    base = data;
    top = data + used;
    end = data + capacity;
}

NotifyStack sNotifyStack;
Qt::HANDLE sMainThreadId = nullptr;
// An empty slot holds this do-nothing hook instead of null, so that the dispatch calls every
// slot without testing it; to the callers of install and de-install the slot is empty.
class EmptyHook final : public ZuApplication::HookNotify
{
public:
    void beforeNotify(QObject*, QEvent*) override {}
    void afterNotify(QObject*, QEvent*) override {}
};
EmptyHook sEmptyHook;
ZuApplication::HookNotify* sHooks[3] = {&sEmptyHook, &sEmptyHook, &sEmptyHook};
// The main thread's id while no hook is installed, else null: one comparison in notify()
// tells both.
Qt::HANDLE sFastPathThreadId = nullptr;
// The main thread's id while hooks are installed (and the stack needs no capacity check).
Qt::HANDLE sHookedPathThreadId = nullptr;
int sDeferredDeleteReports = 0;
const int kMaxDeferredDeleteReports = 5000;

// The same value as QThread::currentThreadId(), without a call: notify() asks for every event.
inline Qt::HANDLE currentThreadHandle()
{
    return ZuPlatform::threadCurrentId();
}

inline bool onMainThread()
{
    return !sMainThreadId || currentThreadHandle() == sMainThreadId;
}

void updateFastPath()
{
    const bool anyHook =
        sHooks[0] != &sEmptyHook || sHooks[1] != &sEmptyHook || sHooks[2] != &sEmptyHook;
    // Without the reserved stack the push needs its capacity check: full path only.
    sFastPathThreadId = (anyHook || !sNotifyStack.reserved) ? nullptr : sMainThreadId;
    sHookedPathThreadId = (anyHook && sNotifyStack.reserved) ? sMainThreadId : nullptr;
}

// Wheel events and deferred deletions need the full dispatch. One bit test on the type modulo
// 64; the few other types that share those bits merely take the full path too.
inline bool isSpecialEventType(QEvent::Type inType)
{
    const quint64 special = (quint64(1) << QEvent::Wheel) | (quint64(1) << QEvent::DeferredDelete);
    return (special >> (unsigned(inType) & 63)) & 1;
}

// QObject keeps a "deleteLater() was called" flag and drops a further deferred delete while
// the flag is set and other events are pending for the object. A postponed deletion is
// swallowed without deleting the object, so the flag has to go before re-posting, or the
// deletion would be lost.
struct DeleteLaterFlag : QObject
{
    static void clear(QObject* inObject)
    {
        (inObject->*(&DeleteLaterFlag::d_ptr))->deleteLaterCalled = false;
    }
};

// Deletions that an object still handling an event obstructed. Re-posting one at once would
// only have it delivered again in the same nested event loop, round after round; it waits
// instead until the notify stack has dropped to the obstructing object's level (its handler
// has returned), which the main event dispatcher's aboutToBlock() and awake() look for.
struct PostponedDeletion
{
    QPointer<QObject> object;
    int level;
};
std::vector<PostponedDeletion> sPostponed;
QMetaObject::Connection sPostponedWatch[2];

void retryPostponed()
{
    const int depth = sNotifyStack.size();
    for (auto it = sPostponed.begin(); it != sPostponed.end();) {
        QObject* object = it->object.data();
        if (object && depth > it->level) {
            ++it;
            continue;
        }
        it = sPostponed.erase(it);
        if (object) {
            DeleteLaterFlag::clear(object);
            object->deleteLater();
        }
    }
    if (sPostponed.empty()) {
        for (QMetaObject::Connection& connection : sPostponedWatch)
            QObject::disconnect(connection);
    }
}

void postpone(QObject* inObject, int inLevel)
{
    if (sPostponed.empty()) {
        QAbstractEventDispatcher* dispatcher = QAbstractEventDispatcher::instance();
        if (!dispatcher)
            qFatal("ZuApplication: no event dispatcher to retry a postponed deletion");
        sPostponedWatch[0] =
            QObject::connect(dispatcher, &QAbstractEventDispatcher::aboutToBlock, &retryPostponed);
        sPostponedWatch[1] =
            QObject::connect(dispatcher, &QAbstractEventDispatcher::awake, &retryPostponed);
    }
    sPostponed.push_back({inObject, inLevel});
}

PostponedDeletion* findPostponed(QObject* inObject)
{
    for (PostponedDeletion& postponed : sPostponed) {
        if (postponed.object == inObject)
            return &postponed;
    }
    return nullptr;
}

// Whether deleting inReceiver now would destroy an object that is still handling an event
// further down the notify stack. Walks the receiver's tree depth first, pre-order; each object
// is looked up in a sorted copy of the stack, so the cost is linear in the size of the tree.
// An obstructed deletion is postponed (above) and reported once.
Q_NEVER_INLINE bool deferredDeleteMustWait(QObject* inReceiver, QEvent* inEvent)
{
    const int depth = sNotifyStack.size();
    if (depth == 0)
        return false;

    // (object, lowest stack index), sorted by object and then index.
    std::vector<std::pair<QObject*, int>> active;
    active.reserve(static_cast<size_t>(depth));
    for (int i = 0; i < depth; ++i)
        active.emplace_back(sNotifyStack.base[i], i);
    std::sort(active.begin(), active.end());

    auto levelOf = [&active](QObject* inObject) {
        const auto it =
            std::lower_bound(active.begin(), active.end(), std::make_pair(inObject, -1));
        return (it != active.end() && it->first == inObject) ? it->second : -1;
    };

    // The first busy object in walk order is the one reported; the deletion waits for the
    // lowest busy one of the whole tree.
    QObject* found = nullptr;
    int foundLevel = -1;
    int waitLevel = depth;
    std::vector<QObject*> pending{inReceiver};
    while (!pending.empty() && waitLevel > 0) {
        QObject* object = pending.back();
        pending.pop_back();
        const int level = levelOf(object);
        if (level >= 0) {
            if (!found) {
                found = object;
                foundLevel = level;
            }
            waitLevel = std::min(waitLevel, level);
        }
        const QObjectList& children = object->children();
        for (auto it = children.crbegin(); it != children.crend(); ++it)
            pending.push_back(*it);
    }
    if (!found)
        return false;

    inEvent->accept();
    // Asked again while it waits (the host called deleteLater() once more): no second report.
    if (PostponedDeletion* waiting = findPostponed(inReceiver)) {
        waiting->level = std::min(waiting->level, waitLevel);
        return true;
    }
    if (sDeferredDeleteReports < kMaxDeferredDeleteReports) {
        // Pointers are written as 0x and hex digits; glibc's %p would add its own 0x.
        getTheLogInstance().tracef(
            RkLogFatal, "DeferredDelete",
            "deletion of [0x%" PRIxPTR " %s] in level [%d] would also delete [0x%" PRIxPTR
            " %s] which is still processing an event in level [%d]",
            reinterpret_cast<uintptr_t>(inReceiver), Q2M(inReceiver->objectName()).constData(),
            depth, reinterpret_cast<uintptr_t>(found), Q2M(found->objectName()).constData(),
            foundLevel);
        ++sDeferredDeleteReports;
    }
    postpone(inReceiver, waitLevel);
    return true;
}

// Pops the notify stack also when an event handler throws through notify().
struct NotifyStackPop
{
    bool active;
    ~NotifyStackPop()
    {
        if (active)
            --sNotifyStack.top;
    }
};

// Main thread, ordinary event, hooks installed: the common case with hooks, kept to the push,
// the six hook calls, the dispatch and the pop.
Q_NEVER_INLINE bool notifyHooked(ZuApplication* inApp, QObject* inReceiver, QEvent* inEvent)
{
    *sNotifyStack.top++ = inReceiver;
    NotifyStackPop pop{true};
    // The table is read afresh for every slot: a hook may remove itself or another one.
    sHooks[0]->beforeNotify(inReceiver, inEvent);
    sHooks[1]->beforeNotify(inReceiver, inEvent);
    sHooks[2]->beforeNotify(inReceiver, inEvent);
    const bool result = inApp->QApplication::notify(inReceiver, inEvent);
    sHooks[2]->afterNotify(inReceiver, inEvent);
    sHooks[1]->afterNotify(inReceiver, inEvent);
    sHooks[0]->afterNotify(inReceiver, inEvent);
    return result;
}

// Every step of the dispatch, for the events the fast path in ZuApplication::notify() leaves.
Q_NEVER_INLINE bool notifyFull(ZuApplication* inApp, QObject* inReceiver, QEvent* inEvent)
{
    const QEvent::Type type = inEvent->type();
    const bool mainThread = onMainThread();
    if (mainThread) {
        if (type == QEvent::DeferredDelete && deferredDeleteMustWait(inReceiver, inEvent))
            return true;
        sNotifyStack.push(inReceiver);
    }
    NotifyStackPop pop{mainThread};

    // The table is read afresh for every slot: a hook may remove itself or another one.
    sHooks[0]->beforeNotify(inReceiver, inEvent);
    sHooks[1]->beforeNotify(inReceiver, inEvent);
    sHooks[2]->beforeNotify(inReceiver, inEvent);

    QObject* target = inReceiver;
    if (type == QEvent::Wheel) {
        if (QObject* grabber = ZuWheelGrabber::grabObject())
            target = grabber;
    }
    const bool result = inApp->QApplication::notify(target, inEvent);

    sHooks[2]->afterNotify(inReceiver, inEvent);
    sHooks[1]->afterNotify(inReceiver, inEvent);
    sHooks[0]->afterNotify(inReceiver, inEvent);
    return result;
}

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
    Q_ASSERT(sMainThreadId == QThread::currentThreadId());
    if (!sNotifyStack.base)
        sNotifyStack.grow();
    updateFastPath();

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

ZuApplication::~ZuApplication()
{
    delete mSplashScreen.data();
}

bool ZuApplication::isMainThread()
{
    return onMainThread();
}

int ZuApplication::callDepth_of_notify()
{
    return sNotifyStack.size();
}

bool ZuApplication::notify(QObject* inReceiver, QEvent* inEvent)
{
    // Fast path for nearly every event: an ordinary event type, the main thread and no hook
    // installed (sFastPathThreadId is the main thread's id only while no hook is installed).
    // Nothing but the stack stays alive across the dispatch, so it costs a handful of
    // instructions. Everything else takes the full dispatch.
    if (Q_LIKELY(!isSpecialEventType(inEvent->type()))) {
        const Qt::HANDLE self = currentThreadHandle();
        if (Q_LIKELY(self == sFastPathThreadId)) {
            *sNotifyStack.top++ = inReceiver;
            NotifyStackPop pop{true};
            return QApplication::notify(inReceiver, inEvent);
        }
        if (self == sHookedPathThreadId)
            return notifyHooked(this, inReceiver, inEvent);
    }
    return notifyFull(this, inReceiver, inEvent);
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
        if (slot == &sEmptyHook) {
            slot = inHook;
            break;
        }
    }
    updateFastPath();
}

void ZuApplication::deInstallHookNotify(HookNotify* inHook)
{
    if (!inHook)
        return;
    for (HookNotify*& slot : sHooks) {
        if (slot == inHook) {
            slot = &sEmptyHook;
            break;
        }
    }
    updateFastPath();
}

const ZuApplication::DefaultParentProvider& ZuApplication::defaultParentProvider()
{
    if (!mDefaultParentProvider)
        mDefaultParentProvider = std::make_unique<DefaultParentProvider>();
    return *mDefaultParentProvider;
}

void ZuApplication::setDefaultParentProvider(DefaultParentProvider* inProvider)
{
    // Handing back the provider held already must not delete it from under ourselves.
    if (inProvider == mDefaultParentProvider.get())
        return;
    mDefaultParentProvider.reset(inProvider);
}

void ZuApplication::setSplashScreen(QSplashScreen* inSplash)
{
    if (inSplash == mSplashScreen)
        return;
    delete mSplashScreen.data();
    mSplashScreen = inSplash;
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
    Q_EMIT protocolHandlerCalled();
}

Qt::MouseButtons ZuApplication::mouseButtons2()
{
    unsigned buttons = 0;
    if (QX11Info::isPlatformX11() && ZuPlatform::inputMouseButtons(QX11Info::display(), buttons)) {
        Qt::MouseButtons result;
        if (buttons & ZuPlatform::kMouseLeft)
            result |= Qt::LeftButton;
        if (buttons & ZuPlatform::kMouseRight)
            result |= Qt::RightButton;
        if (buttons & ZuPlatform::kMouseMiddle)
            result |= Qt::MiddleButton;
        return result;
    }
    // No window system to ask: the state Qt saw last is the closest we have.
    return QGuiApplication::mouseButtons();
}
