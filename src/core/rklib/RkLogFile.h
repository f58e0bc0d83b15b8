#pragma once

#include "rklib/RkString.h"
#include "rklib/rklib_export.h"

#include <chrono>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

// Log levels: 0 debug, 1 information, 2 warning, 3 error, 4 fatal; 5 switches a level off.
enum RkLogLevel
{
    RkLogDebug = 0,
    RkLogInfo = 1,
    RkLogWarning = 2,
    RkLogError = 3,
    RkLogFatal = 4,
    RkLogOff = 5
};

// One logged line as the sinks see it.
struct RkLogEntry
{
    std::chrono::system_clock::time_point time;
    long thread = 0;
    RkLogLevel level = RkLogInfo;
    std::string category;
    std::string text;
};

// The process-wide log. Thread-safe; every call writes exactly one line
// "<time> [<thread>] <level letter> <category>: <text>" (no category: "... <level letter> <text>")
// to stderr, or to the file named by ZUBASE_LOG_FILE. ZUBASE_LOG_LEVEL (0..5, default 1) is the
// lowest level written there; a value that is no level, or a file that cannot be opened, is
// said on stderr when the log is made, and the default kept. Control characters are written there
// as C escapes
// ("\n", "\x1b"), tabs as they are, so one call stays one line. Sinks (RkLogCapture in tests)
// and the write callback see every entry with its text as it was given.
class RKLIB_EXPORT RkLogFile
{
public:
    using WriteCallback = void (*)(RkLogLevel, const RkString&);
    using Sink = std::function<void(const RkLogEntry&)>;

    RkLogFile();
    ~RkLogFile();
    RkLogFile(const RkLogFile&) = delete;
    RkLogFile& operator=(const RkLogFile&) = delete;

    // Information (level 1) without category.
    void printf(const char* inFormat, ...) __attribute__((format(printf, 2, 3)));
    // Warning (level 2) without category.
    void warnf(const char* inFormat, ...) __attribute__((format(printf, 2, 3)));
    // Error (level 3) without category.
    void errorf(const char* inFormat, ...) __attribute__((format(printf, 2, 3)));
    void tracef(RkLogLevel inLevel, const char* inCategory, const char* inFormat, ...)
        __attribute__((format(printf, 4, 5)));
    // Information (level 1) with a category and a ready text.
    void print(const char* inCategory, const char* inText);
    // The single entry point all of the above end in.
    void write(RkLogLevel inLevel, const char* inCategory, const std::string& inText);

    // The callback sees every line of at least inLevel that is not hidden by an
    // RkLogFileWriteCallbackDisabler; setWriteCallback(nullptr, RkLogOff) removes it.
    void setWriteCallback(WriteCallback inCallback, RkLogLevel inLevel);

    // Lowest level written to the output (stderr or file); sinks see all levels.
    void setOutputLevel(RkLogLevel inLevel);
    RkLogLevel outputLevel() const;
    // Redirects the output to a file (appending); an empty path means stderr.
    bool setOutputFile(const std::string& inPath);

    // Sinks see every line; they must not log themselves. Once removeSink() has returned,
    // the sink is not called any more.
    int addSink(Sink inSink);
    void removeSink(int inId);

    static std::string formatLine(const RkLogEntry& inEntry);

private:
    friend class RkLogFileWriteCallbackDisabler;
    struct Private;
    std::unique_ptr<Private> d;
};

// The process-wide log instance.
RKLIB_EXPORT RkLogFile& getTheLogInstance();

// Hides what the calling thread logs from the write callback between
// disableWriteCallback() and restoreWriteCallback() (also restored on destruction).
class RKLIB_EXPORT RkLogFileWriteCallbackDisabler
{
public:
    RkLogFileWriteCallbackDisabler() = default;
    ~RkLogFileWriteCallbackDisabler();
    RkLogFileWriteCallbackDisabler(const RkLogFileWriteCallbackDisabler&) = delete;
    RkLogFileWriteCallbackDisabler& operator=(const RkLogFileWriteCallbackDisabler&) = delete;

    void disableWriteCallback();
    void restoreWriteCallback();

private:
    bool mDisabled = false;
};

// Collects every line logged while it lives; for tests and diagnostics.
class RKLIB_EXPORT RkLogCapture
{
public:
    RkLogCapture();
    ~RkLogCapture();
    RkLogCapture(const RkLogCapture&) = delete;
    RkLogCapture& operator=(const RkLogCapture&) = delete;

    std::vector<RkLogEntry> entries() const;
    // Texts of the captured lines, optionally only those of one category.
    std::vector<std::string> texts() const;
    std::vector<std::string> texts(const std::string& inCategory) const;
    // Whole formatted lines as the output shows them (control characters escaped), without the
    // time and thread columns.
    std::vector<std::string> lines() const;
    void clear();

private:
    mutable std::mutex mMutex;
    std::vector<RkLogEntry> mEntries;
    int mSinkId = -1;
};
