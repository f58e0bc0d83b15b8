#pragma once

#include "zubase/zubase_export.h"

#include <QAction>
#include <QApplication>
#include <QCursor>
#include <QHash>
#include <QPointer>
#include <QString>

#include <memory>

class QSplashScreen;
class QUrl;

// The one application object of a graphical host. On top of QApplication it records the main
// thread, snapshots the environment, guards the event dispatch (a deletion that would destroy
// an object still handling an event further down the stack is postponed and logged), lets up to
// three hooks watch every event, redirects wheel events to the wheel grabber, and owns the
// default dialog parent, the splash screen and the about action. Made only by createInstance().
class ZUBASE_EXPORT ZuApplication : public QApplication
{
    Q_OBJECT
public:
    // Names the window that parentless dialogs are parented to; the base names none.
    class ZUBASE_EXPORT DefaultParentProvider
    {
    public:
        virtual ~DefaultParentProvider();
        virtual QWidget* defaultParent() const;
    };

    // Sees every event of the process before and after its dispatch, on every thread that
    // dispatches events; an implementation must be thread-safe or filter by isMainThread().
    class ZUBASE_EXPORT HookNotify
    {
    public:
        virtual ~HookNotify();
        virtual void beforeNotify(QObject* inReceiver, QEvent* inEvent) = 0;
        virtual void afterNotify(QObject* inReceiver, QEvent* inEvent) = 0;
    };

    // Scoped override cursor: Busy(true) shows the wait cursor; Busy(false) inside a busy phase
    // shows the arrow (for a modal interaction), outside one it does nothing.
    class ZUBASE_EXPORT Busy
    {
    public:
        explicit Busy(bool inBusy);
        ~Busy();
        Busy(const Busy&) = delete;
        Busy& operator=(const Busy& inOther);

    private:
        bool mActive = false;
    };

    // Makes the application object unless one exists; null when one of another class exists.
    static ZuApplication* createInstance(int& argc, char** argv, char** envp);
    // The application object, null when there is none or it is of another class.
    static ZuApplication* instance();

    ~ZuApplication() override;

    // True on the thread that made the application, and on any thread before that.
    static bool isMainThread();
    // Nesting depth of event dispatch on the main thread.
    static int callDepth_of_notify();

    bool notify(QObject* inReceiver, QEvent* inEvent) override;

    // Hooks are not owned; at most three, a further one is dropped silently. Their owners
    // must de-install them before destroying them. Main thread only.
    static void installHookNotify(HookNotify* inHook);
    static void deInstallHookNotify(HookNotify* inHook);

    // Never dangling: when no provider is set, a base provider (no parent) is made.
    const DefaultParentProvider& defaultParentProvider();
    // Takes ownership; the previous provider is deleted (not when it is handed in again).
    void setDefaultParentProvider(DefaultParentProvider* inProvider);

    // Takes ownership, deleting the previous splash screen (unless the host has deleted it
    // already); a new one is shown and painted at once. Null closes the current one.
    void setSplashScreen(QSplashScreen* inSplash);

    // Routes the about action to inMember (a SLOT() string) of inReceiver, dropping earlier
    // connections.
    void connectShowAbout(const QObject* inReceiver, const char* inMember);

    // The environment given to createInstance(), by variable name.
    const QHash<QString, QString>& environment() const;
    // Exact, case-sensitive lookup; a null string when absent.
    QString environmentLookup(const QString& inName) const;

    // Delivers posted events and processes the queue until it is empty, at most 19 passes.
    static void flushPendingEvents();
    static QCursor busyCursor();
    // The mouse buttons physically held down now, asked from the window system where it can
    // tell (X11); elsewhere the state Qt last saw.
    static Qt::MouseButtons mouseButtons2();

public Q_SLOTS:
    // Triggers the about action.
    void showAbout();

Q_SIGNALS:
    // Emitted after handleFileOpenEvent() has started the control program.
    void protocolHandlerCalled();

protected:
    bool event(QEvent* inEvent) override;
    // Starts "tzcontrol" from the application directory with "--cfgfile <file>", or with the
    // URL text (blanks as %20) when inFile is empty; nothing when both are empty.
    void handleFileOpenEvent(const QString& inFile, const QUrl& inUrl);

private:
    ZuApplication(int& argc, char** argv, char** envp);
    bool n_______________________________________(QObject* inReceiver, QEvent* inEvent);

    std::unique_ptr<DefaultParentProvider> mDefaultParentProvider;
    // Guarded: the host may delete its splash screen itself.
    QPointer<QSplashScreen> mSplashScreen;
    QAction mAboutAction;
    QHash<QString, QString> mEnvironment;
};
