#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkResult.h"

#include <QList>
#include <QMultiMap>
#include <QObject>
#include <QSharedPointer>
#include <QString>
#include <QStringList>

#include <cstdint>

namespace ZuBase {

// Starts a sibling executable (optionally elevated), watches it until it ends and reports the end
// with terminated(); also lists the machine's processes and their modules. The child is created
// suspended and runs after resume() or wait(). Polling runs on the owner's event loop.
//
//     auto* process = new ZuBase::Process;
//     process->mExePath = "/opt/app/bin/tzserver";
//     process->mArguments << "--port" << "4000";
//     connect(process, &ZuBase::Process::terminated, ...);
//     if (process->start(false, true, false).isOk())
//         process->resume();
class ZUBASE_EXPORT Process : public QObject
{
    Q_OBJECT

public:
    Process();
    ~Process() override;

    // Starts mExePath with mArguments in mWorkingDirectory. The third flag is accepted and not
    // used. A non-elevated child is suspended until resume() or wait(); an elevated one runs at
    // once, is not watched and leaves the process id 4711.
    RkResult start(bool inElevate, bool inInheritEnvironment, bool inUnused);
    // Lets the suspended child run.
    void resume();
    // Resumes the child and waits until it has ended; returns its exit code.
    int wait();
    // Whether the watched process still runs; stores the exit code once it has ended.
    bool isRunning();
    // Kills the watched process; its exit code becomes inExitCode. terminated() follows from
    // the polling.
    RkResult terminate(int inExitCode);
    // Closes the process and thread handles; the destructor leaves them to the owner.
    void detach();

    unsigned int processId() const { return mProcessId; }
    // -1 until the end of the child has been seen.
    int exitCode() const { return mExitCode; }
    // The executable of the watched process.
    RkResult imageFilePath(QString& outPath);
    // The files loaded as code into the watched process: executable and shared libraries.
    RkResult modules(QStringList& outPaths);

    // One new Process per running process, in the reverse of the system's order.
    static RkResult processes(QList<QSharedPointer<Process>>& outList);
    // The processes that have one of inModulePaths loaded, keyed by the normalised module path.
    static RkResult processesByModule(const QStringList& inModulePaths,
                                      QMultiMap<QString, QSharedPointer<Process>>& outMap);
    // A new Process watching the calling process.
    static QSharedPointer<Process> self();
    // Whether the current process runs with full administrator rights (root). Cached.
    static bool elevated();
    // Whether the current user is an administrator (root, or in sudo, wheel or admin). Cached;
    // the first call prints the elevation information to standard output.
    static bool userIsAdmin();
    // Ends the current process with inCode, or hands inCode and inMessage to the exit callback
    // and returns when one is set.
    static void exit(int inCode, QString inMessage);
    // Null restores ending the process at once.
    static void setExitCallback(void (*inCallback)(int, QString));
    // Nothing to do here: children get none of our descriptors anyway.
    static void flagAllDescriptorsToCloseOnExec();

    // Inputs, set by the host before start().
    QString mWorkingDirectory; // empty: the caller's current directory
    QString mExePath;          // full path of the executable
    QStringList mArguments;    // inserted verbatim, one blank before each
    QStringList mEnvironment;  // "NAME=value" entries

Q_SIGNALS:
    // Emitted once when the child is seen to have ended.
    void terminated();

public Q_SLOTS:
    // Emits terminated() when the child has ended, else looks again in 100 ms.
    void checkRunning();

private:
    void closeHandles();
    int openWatched(bool inFullAccess, std::intptr_t& outHandle) const;

    // The created child's process and main-thread handles; zero before a start.
    std::intptr_t mProcessHandle = 0;
    std::intptr_t mThreadHandle = 0;
    unsigned int mProcessId = 0;
    int mExitCode = -1;
    bool mPollArmed = false;
    bool mTerminatedEmitted = false;
    bool mPlaceholderId = false; // the process id is the fixed one of an elevated start

    static void (*sExitCallback)(int, QString);
};

} // namespace ZuBase
