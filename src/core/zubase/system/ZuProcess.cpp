#include "zubase/ZuProcess.h"

#include <unistd.h>

ZuProcess::ZuProcess(QObject* inParent, bool inCloseStandardStreams)
    : QProcess(inParent), mCloseStandardStreams(inCloseStandardStreams)
{}

ZuProcess::~ZuProcess() = default;

bool ZuProcess::stableWaitForFinished(int inMsecs)
{
    return waitForFinished(inMsecs);
}

void ZuProcess::setupChildProcess()
{
    // Runs between fork and exec: plain descriptor calls only, no stdio locks.
    if (mCloseStandardStreams) {
        ::close(STDERR_FILENO);
        ::close(STDOUT_FILENO);
        ::close(STDIN_FILENO);
    }
}
