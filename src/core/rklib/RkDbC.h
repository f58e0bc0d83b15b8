#pragma once

#include "rklib/rklib_export.h"

// Kinds of contract violations reported to the DbC callback.
enum DbCEventType
{
    DbCPrecondition = 0,
    DbCPostcondition = 1,
    DbCInvariant = 2,
    DbCAssertion = 3
};

// Called on a contract violation with (type, condition, file, line, function, message).
using RkDbCCallback = void (*)(DbCEventType, const char*, const char*, unsigned, const char*,
                               const char*);

// Sets the contract-violation callback (null clears it); returns nothing.
RKLIB_EXPORT void rk_DbC_callbackSet(RkDbCCallback inCallback);
RKLIB_EXPORT RkDbCCallback rk_DbC_callback();
// Reports a violation to the callback, or to the log when none is set.
RKLIB_EXPORT void rk_DbC_report(DbCEventType inType, const char* inCondition, const char* inFile,
                                unsigned inLine, const char* inFunction, const char* inMessage);

// Switches the probe for the shell-extension crash of a backup product; returns the previous state.
RKLIB_EXPORT bool rkEnableProbeDellBackupAndRecoveryCrash(bool inEnable);
RKLIB_EXPORT bool rkProbeDellBackupAndRecoveryCrashEnabled();
