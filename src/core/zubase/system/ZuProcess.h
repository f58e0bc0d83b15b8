#pragma once

#include "zubase/zubase_export.h"

#include <QProcess>

// A QProcess whose child can be started without standard streams, for programs that must not
// inherit the host's console or pipes.
class ZUBASE_EXPORT ZuProcess : public QProcess
{
    Q_OBJECT

public:
    explicit ZuProcess(QObject* inParent = nullptr, bool inCloseStandardStreams = false);
    ~ZuProcess() override;

    // QProcess::waitForFinished(inMsecs).
    bool stableWaitForFinished(int inMsecs);

protected:
    // In the child: closes standard error, output and input, in that order, when asked to.
    void setupChildProcess() override;

private:
    bool mCloseStandardStreams = false;
};
