#include "rklib/RkDbC.h"

#include "rklib/RkLogFile.h"

#include <atomic>

namespace {
std::atomic<RkDbCCallback> sDbCCallback{nullptr};
std::atomic<bool> sProbeDellCrash{false};
} // namespace

void rk_DbC_callbackSet(RkDbCCallback inCallback)
{
    sDbCCallback.store(inCallback);
}

RkDbCCallback rk_DbC_callback()
{
    return sDbCCallback.load();
}

void rk_DbC_report(DbCEventType inType, const char* inCondition, const char* inFile,
                   unsigned inLine, const char* inFunction, const char* inMessage)
{
    if (RkDbCCallback callback = sDbCCallback.load()) {
        callback(inType, inCondition, inFile, inLine, inFunction, inMessage);
        return;
    }
    getTheLogInstance().tracef(RkLogError, "DbC", "%s(%u) %s: violated [%s] %s",
                               inFile ? inFile : "", inLine, inFunction ? inFunction : "",
                               inCondition ? inCondition : "", inMessage ? inMessage : "");
}

bool rkEnableProbeDellBackupAndRecoveryCrash(bool inEnable)
{
    return sProbeDellCrash.exchange(inEnable);
}

bool rkProbeDellBackupAndRecoveryCrashEnabled()
{
    return sProbeDellCrash.load();
}
