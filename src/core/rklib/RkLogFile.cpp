#include "rklib/RkLogFile.h"

#include <atomic>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <map>
#include <shared_mutex>
#include <sys/syscall.h>
#include <unistd.h>

namespace {

thread_local int tCallbackDisabled = 0;

std::string vformat(const char* inFormat, va_list inArgs)
{
    if (!inFormat)
        return std::string();
    va_list copy;
    va_copy(copy, inArgs);
    char buffer[512];
    const int needed = std::vsnprintf(buffer, sizeof buffer, inFormat, copy);
    va_end(copy);
    if (needed < 0)
        return std::string();
    if (std::size_t(needed) < sizeof buffer)
        return std::string(buffer, std::size_t(needed));
    std::string text(std::size_t(needed), '\0');
    std::vsnprintf(text.data(), std::size_t(needed) + 1, inFormat, inArgs);
    return text;
}

long currentThreadId()
{
    return long(::syscall(SYS_gettid));
}

// Control characters written to the output as C escapes (a line feed as backslash and n, an
// escape character as backslash, x1b), so that one call stays one line there and a logged value
// can neither forge lines nor drive a terminal. Tabs stay. Sinks and the write callback get the
// text as it was given.
std::string escapedControls(const std::string& inText)
{
    std::string text;
    text.reserve(inText.size());
    for (const char c : inText) {
        const unsigned char byte = static_cast<unsigned char>(c);
        if ((byte >= 0x20 && byte != 0x7F) || c == '\t') {
            text += c;
        } else if (c == '\n') {
            text += "\\n";
        } else if (c == '\r') {
            text += "\\r";
        } else {
            static const char digits[] = "0123456789abcdef";
            text += "\\x";
            text += digits[byte >> 4];
            text += digits[byte & 15];
        }
    }
    return text;
}

// Says on standard error why a setting of the environment is not used; the log reads the
// environment once, when it is made.
void complain(const std::string& inText)
{
    std::fprintf(stderr, "zubase: %s\n", inText.c_str());
}

} // namespace

struct RkLogFile::Private
{
    std::mutex outputMutex;
    std::FILE* output = stderr;
    bool ownsOutput = false;
    std::atomic<RkLogLevel> outputLevel{RkLogInfo}; // read by every write without a lock

    std::mutex sinkMutex;
    // Held shared while sinks run, exclusively by removeSink(), so that a removed sink is
    // never called again once removeSink() has returned.
    std::shared_mutex sinkCallMutex;
    std::map<int, std::shared_ptr<Sink>> sinks;
    int nextSinkId = 1;
    WriteCallback callback = nullptr;
    RkLogLevel callbackLevel = RkLogOff;
};

RkLogFile::RkLogFile() : d(new Private)
{
    if (const char* level = std::getenv("ZUBASE_LOG_LEVEL"); level && *level) {
        char* end = nullptr;
        errno = 0;
        const long value = std::strtol(level, &end, 10);
        if (errno == 0 && *end == '\0' && value >= RkLogDebug && value <= RkLogOff)
            d->outputLevel = RkLogLevel(value);
        else
            complain(std::string("ZUBASE_LOG_LEVEL \"") + level +
                     "\" is no level from 0 to 5; the log keeps level 1");
    }
    if (const char* path = std::getenv("ZUBASE_LOG_FILE"); path && *path) {
        if (!setOutputFile(path))
            complain(std::string("cannot open ZUBASE_LOG_FILE \"") + path + "\" (" +
                     std::strerror(errno) + "); the log goes to standard error");
    }
}

RkLogFile::~RkLogFile()
{
    if (d->ownsOutput)
        std::fclose(d->output);
}

void RkLogFile::printf(const char* inFormat, ...)
{
    va_list args;
    va_start(args, inFormat);
    write(RkLogInfo, "", vformat(inFormat, args));
    va_end(args);
}

void RkLogFile::warnf(const char* inFormat, ...)
{
    va_list args;
    va_start(args, inFormat);
    write(RkLogWarning, "", vformat(inFormat, args));
    va_end(args);
}

void RkLogFile::errorf(const char* inFormat, ...)
{
    va_list args;
    va_start(args, inFormat);
    write(RkLogError, "", vformat(inFormat, args));
    va_end(args);
}

void RkLogFile::tracef(RkLogLevel inLevel, const char* inCategory, const char* inFormat, ...)
{
    va_list args;
    va_start(args, inFormat);
    write(inLevel, inCategory, vformat(inFormat, args));
    va_end(args);
}

void RkLogFile::print(const char* inCategory, const char* inText)
{
    write(RkLogInfo, inCategory, inText ? inText : "");
}

void RkLogFile::write(RkLogLevel inLevel, const char* inCategory, const std::string& inText)
{
    RkLogEntry entry;
    entry.time = std::chrono::system_clock::now();
    entry.thread = currentThreadId();
    entry.level = inLevel;
    entry.category = inCategory ? inCategory : "";
    entry.text = inText;

    if (inLevel >= d->outputLevel.load() && inLevel < RkLogOff) {
        const std::string line = formatLine(entry) + '\n';
        std::lock_guard<std::mutex> lock(d->outputMutex);
        std::fwrite(line.data(), 1, line.size(), d->output);
        std::fflush(d->output);
    }

    // The callback runs outside every lock so that it may log itself.
    WriteCallback callback = nullptr;
    {
        std::shared_lock<std::shared_mutex> calling(d->sinkCallMutex);
        std::vector<std::shared_ptr<Sink>> sinks;
        {
            std::lock_guard<std::mutex> lock(d->sinkMutex);
            sinks.reserve(d->sinks.size());
            for (const auto& sink : d->sinks)
                sinks.push_back(sink.second);
            if (inLevel >= d->callbackLevel && tCallbackDisabled == 0)
                callback = d->callback;
        }
        for (const auto& sink : sinks)
            (*sink)(entry);
    }
    if (callback)
        callback(inLevel, RkString(entry.text));
}

void RkLogFile::setWriteCallback(WriteCallback inCallback, RkLogLevel inLevel)
{
    std::lock_guard<std::mutex> lock(d->sinkMutex);
    d->callback = inCallback;
    d->callbackLevel = inCallback ? inLevel : RkLogOff;
}

void RkLogFile::setOutputLevel(RkLogLevel inLevel)
{
    d->outputLevel = inLevel;
}

RkLogLevel RkLogFile::outputLevel() const
{
    return d->outputLevel.load();
}

bool RkLogFile::setOutputFile(const std::string& inPath)
{
    std::FILE* file = stderr;
    if (!inPath.empty()) {
        // Close-on-exec ("e"): the children the library starts must not inherit the log.
        file = std::fopen(inPath.c_str(), "ae");
        if (!file)
            return false;
    }
    std::lock_guard<std::mutex> lock(d->outputMutex);
    if (d->ownsOutput)
        std::fclose(d->output);
    d->output = file;
    d->ownsOutput = file != stderr;
    return true;
}

int RkLogFile::addSink(Sink inSink)
{
    std::lock_guard<std::mutex> lock(d->sinkMutex);
    const int id = d->nextSinkId++;
    d->sinks.emplace(id, std::make_shared<Sink>(std::move(inSink)));
    return id;
}

void RkLogFile::removeSink(int inId)
{
    {
        std::lock_guard<std::mutex> lock(d->sinkMutex);
        d->sinks.erase(inId);
    }
    // Wait for calls that picked the sink up before it was erased.
    std::unique_lock<std::shared_mutex> drained(d->sinkCallMutex);
}

std::string RkLogFile::formatLine(const RkLogEntry& inEntry)
{
    static const char kLevelLetters[] = "DIWEF-";
    const std::time_t seconds = std::chrono::system_clock::to_time_t(inEntry.time);
    const auto millis =
        std::chrono::duration_cast<std::chrono::milliseconds>(inEntry.time.time_since_epoch())
            .count() %
        1000;
    std::tm local{};
    localtime_r(&seconds, &local);
    char stamp[64];
    std::snprintf(
        stamp, sizeof stamp, "%04d-%02d-%02d %02d:%02d:%02d.%03d [%ld] %c ", local.tm_year + 1900,
        local.tm_mon + 1, local.tm_mday, local.tm_hour, local.tm_min, local.tm_sec, int(millis),
        inEntry.thread,
        kLevelLetters[inEntry.level >= 0 && inEntry.level <= RkLogOff ? inEntry.level : 5]);
    std::string line = stamp;
    if (!inEntry.category.empty())
        line += escapedControls(inEntry.category) + ": ";
    line += escapedControls(inEntry.text);
    return line;
}

RkLogFile& getTheLogInstance()
{
    // Never destroyed: static destructors of other libraries may still log.
    static RkLogFile* const instance = new RkLogFile;
    return *instance;
}

RkLogFileWriteCallbackDisabler::~RkLogFileWriteCallbackDisabler()
{
    restoreWriteCallback();
}

void RkLogFileWriteCallbackDisabler::disableWriteCallback()
{
    if (!mDisabled) {
        mDisabled = true;
        ++tCallbackDisabled;
    }
}

void RkLogFileWriteCallbackDisabler::restoreWriteCallback()
{
    if (mDisabled) {
        mDisabled = false;
        --tCallbackDisabled;
    }
}

RkLogCapture::RkLogCapture()
{
    mSinkId = getTheLogInstance().addSink([this](const RkLogEntry& inEntry) {
        std::lock_guard<std::mutex> lock(mMutex);
        mEntries.push_back(inEntry);
    });
}

RkLogCapture::~RkLogCapture()
{
    getTheLogInstance().removeSink(mSinkId);
}

std::vector<RkLogEntry> RkLogCapture::entries() const
{
    std::lock_guard<std::mutex> lock(mMutex);
    return mEntries;
}

std::vector<std::string> RkLogCapture::texts() const
{
    std::lock_guard<std::mutex> lock(mMutex);
    std::vector<std::string> result;
    result.reserve(mEntries.size());
    for (const RkLogEntry& entry : mEntries)
        result.push_back(entry.text);
    return result;
}

std::vector<std::string> RkLogCapture::texts(const std::string& inCategory) const
{
    std::lock_guard<std::mutex> lock(mMutex);
    std::vector<std::string> result;
    for (const RkLogEntry& entry : mEntries) {
        if (entry.category == inCategory)
            result.push_back(entry.text);
    }
    return result;
}

std::vector<std::string> RkLogCapture::lines() const
{
    static const char kLevelLetters[] = "DIWEF-";
    std::lock_guard<std::mutex> lock(mMutex);
    std::vector<std::string> result;
    for (const RkLogEntry& entry : mEntries) {
        std::string line(
            1, kLevelLetters[entry.level >= 0 && entry.level <= RkLogOff ? entry.level : 5]);
        line += ' ';
        if (!entry.category.empty())
            line += escapedControls(entry.category) + ": ";
        result.push_back(line + escapedControls(entry.text));
    }
    return result;
}

void RkLogCapture::clear()
{
    std::lock_guard<std::mutex> lock(mMutex);
    mEntries.clear();
}
