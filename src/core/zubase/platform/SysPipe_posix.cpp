// POSIX backend of the pipe platform layer: Unix-domain stream sockets.
#include "zubase/platform/SysPipe.h"

#include "zubase/platform/HandleTable.h"
#include "zubase/platform/Sha256.h"
#include "zubase/platform/UniqueFd.h"

#include <array>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <memory>
#include <mutex>
#include <thread>

#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace ZuPlatform {

namespace {

const char* const kSystemPrefix = "\\\\.\\pipe\\";

// Descriptors are closed only when the last transfer using them has returned, so that a
// descriptor number is never reused under a blocked call.
struct PipeObject
{
    ~PipeObject()
    {
        for (int fd : {listenFd.load(), connFd.load()})
            if (fd != UniqueFd::kNone)
                ::close(fd);
    }
    bool server = false;
    std::mutex mutex; // serialises accepting and closing
    // Set once, read by transfers in other threads: atomic rather than UniqueFd.
    std::atomic<int> listenFd{UniqueFd::kNone};
    std::atomic<int> connFd{UniqueFd::kNone};
    UniqueFd lockFd;
    std::atomic<bool> closed{false};
    std::string socketPath;
    std::string lockPath;
};

HandleTable<std::shared_ptr<PipeObject>>& table()
{
    static auto* const instance = new HandleTable<std::shared_ptr<PipeObject>>(0x1000);
    return *instance;
}

std::shared_ptr<PipeObject> find(PipeHandle inPipe)
{
    std::shared_ptr<PipeObject> object;
    table().find(inPipe, object);
    return object;
}

// A directory of our own: it exists, is no link, belongs to us and nobody else may enter it.
int ownPrivateDirectory(const std::string& inPath, bool inCreate)
{
    if (inCreate && mkdir(inPath.c_str(), 0700) != 0 && errno != EEXIST)
        return errno;
    struct stat info;
    if (lstat(inPath.c_str(), &info) != 0)
        return errno;
    if (!S_ISDIR(info.st_mode) || info.st_uid != geteuid())
        return EACCES;
    if ((info.st_mode & 077) != 0 && chmod(inPath.c_str(), 0700) != 0)
        return errno;
    return 0;
}

// Decided by the user id alone, not by the environment: both ends must find the same place
// even when one of them was started with a reduced environment.
int pipeDirectory(std::string& outPath)
{
    const std::string uid = std::to_string(geteuid());
    const std::string runtime = "/run/user/" + uid;
    if (ownPrivateDirectory(runtime, false) == 0) {
        outPath = runtime + "/zubase-pipes";
        return ownPrivateDirectory(outPath, true);
    }
    outPath = "/tmp/zubase-pipes-" + uid;
    return ownPrivateDirectory(outPath, true);
}

std::string shortName(const std::string& inSystemName)
{
    std::string name = inSystemName;
    if (name.compare(0, std::strlen(kSystemPrefix), kSystemPrefix) == 0)
        name.erase(0, std::strlen(kSystemPrefix));
    return name;
}

// The name as a file name: letters, digits, '.', '_' and '-' as they are, other bytes as %XX.
std::string encodedName(const std::string& inName)
{
    static const char digits[] = "0123456789ABCDEF";
    std::string encoded;
    for (unsigned char c : inName) {
        if ((c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') ||
            c == '.' || c == '_' || c == '-') {
            encoded += static_cast<char>(c);
        } else {
            encoded += '%';
            encoded += digits[c >> 4];
            encoded += digits[c & 15];
        }
    }
    return encoded;
}

// A name whose socket path would not fit sun_path gets '~' and 128 bits of its SHA-256. The
// encoding never leaves a '~', so such names cannot meet the encoded ones.
std::string hashedName(const std::string& inName)
{
    static const char digits[] = "0123456789abcdef";
    const std::array<std::uint8_t, 32> digest = sha256(inName);
    std::string hashed = "~";
    for (int i = 0; i < 16; ++i) {
        hashed += digits[digest[i] >> 4];
        hashed += digits[digest[i] & 15];
    }
    return hashed;
}

int paths(const std::string& inSystemName, std::string& outSocket, std::string& outLock)
{
    std::string dir;
    if (const int error = pipeDirectory(dir))
        return error;
    const std::string name = shortName(inSystemName);
    std::string base = dir + "/" + encodedName(name);
    if (base.size() + std::strlen(".pipe") >= sizeof(sockaddr_un::sun_path))
        base = dir + "/" + hashedName(name);
    outSocket = base + ".pipe";
    outLock = base + ".lock";
    return 0;
}

sockaddr_un addressOf(const std::string& inPath)
{
    sockaddr_un address;
    std::memset(&address, 0, sizeof address);
    address.sun_family = AF_UNIX;
    std::memcpy(address.sun_path, inPath.c_str(), inPath.size());
    return address;
}

flock wholeFile(short inType)
{
    flock range;
    std::memset(&range, 0, sizeof range);
    range.l_type = inType;
    range.l_whence = SEEK_SET;
    return range;
}

// A live server holds the write lock on the lock file.
bool serverIsLive(const std::string& inSocketPath, const std::string& inLockPath)
{
    struct stat info;
    if (stat(inSocketPath.c_str(), &info) != 0 || !S_ISSOCK(info.st_mode))
        return false;
    const UniqueFd lock(open(inLockPath.c_str(), O_RDONLY | O_CLOEXEC | O_NOFOLLOW));
    flock probe = wholeFile(F_RDLCK);
    return lock.isOpen() && fcntl(lock.get(), F_OFD_GETLK, &probe) == 0 && probe.l_type != F_UNLCK;
}

// Takes the server lock; EADDRINUSE while another live server holds it.
int takeServerLock(const std::string& inLockPath, UniqueFd& outLock)
{
    for (int attempt = 0; attempt < 10; ++attempt) {
        UniqueFd lock(open(inLockPath.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_NOFOLLOW, 0600));
        if (!lock.isOpen())
            return errno;
        flock range = wholeFile(F_WRLCK);
        if (fcntl(lock.get(), F_OFD_SETLK, &range) != 0)
            return errno == EAGAIN || errno == EACCES ? EADDRINUSE : errno;
        // A closing server unlinks the file: a lock on an unlinked file guards nothing.
        struct stat held, named;
        if (fstat(lock.get(), &held) == 0 && stat(inLockPath.c_str(), &named) == 0 &&
            held.st_dev == named.st_dev && held.st_ino == named.st_ino) {
            outLock = std::move(lock);
            return 0;
        }
    }
    return EAGAIN;
}

int pollOne(int inFd, short inEvents, int inTimeoutMs, short& outEvents)
{
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::milliseconds(inTimeoutMs);
    for (;;) {
        pollfd item{inFd, inEvents, 0};
        const int remaining = static_cast<int>(
            std::max<long long>(0, std::chrono::duration_cast<std::chrono::milliseconds>(
                                       deadline - std::chrono::steady_clock::now())
                                       .count()));
        const int ready = ::poll(&item, 1, remaining);
        if (ready >= 0) {
            outEvents = ready ? item.revents : 0;
            return 0;
        }
        if (errno != EINTR)
            return errno;
    }
}

} // namespace

int pipeSocketPath(const std::string& inSystemName, std::string& outPath)
{
    std::string lockPath;
    return paths(inSystemName, outPath, lockPath);
}

int createNamedPipe(const std::string& inSystemName, PipeHandle& outPipe)
{
    outPipe = kInvalidHandle;
    auto object = std::make_shared<PipeObject>();
    object->server = true;
    if (const int error = paths(inSystemName, object->socketPath, object->lockPath))
        return error;
    if (const int error = takeServerLock(object->lockPath, object->lockFd))
        return error;
    // We hold the lock: a socket file left here belongs to a server that died.
    if (unlink(object->socketPath.c_str()) != 0 && errno != ENOENT)
        return errno;
    const int fd = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (fd < 0)
        return errno;
    object->listenFd = fd; // closed with the object
    const sockaddr_un address = addressOf(object->socketPath);
    // A backlog of 0 queues exactly one connection: the one instance. A second client that
    // comes before the accept finds the queue full and is told that the pipe is busy.
    if (bind(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0 ||
        listen(fd, 0) != 0) {
        const int error = errno;
        unlink(object->socketPath.c_str());
        unlink(object->lockPath.c_str());
        return error;
    }
    outPipe = table().add(std::move(object));
    return 0;
}

int connectNamedPipe(PipeHandle inPipe, int inTimeoutMs)
{
    const std::shared_ptr<PipeObject> object = find(inPipe);
    if (!object || !object->server)
        return EBADF;
    std::lock_guard<std::mutex> lock(object->mutex);
    if (object->closed)
        return EBADF;
    short events = 0;
    if (const int conn = object->connFd; conn != UniqueFd::kNone) {
        // Connected already; a client that has gone leaves the pipe unusable.
        if (const int error = pollOne(conn, 0, 0, events))
            return error;
        return events & (POLLHUP | POLLERR) ? EPIPE : 0;
    }
    const int listener = object->listenFd;
    if (listener == UniqueFd::kNone)
        return EBADF;
    if (const int error = pollOne(listener, POLLIN, inTimeoutMs, events))
        return error;
    if (object->closed)
        return EBADF;
    if (!(events & POLLIN))
        return ETIMEDOUT;
    const int conn = accept4(listener, nullptr, nullptr, SOCK_CLOEXEC);
    if (conn < 0)
        return errno == EAGAIN ? ETIMEDOUT : errno;
    object->connFd = conn;
    // One instance: later clients find the pipe busy.
    shutdown(listener, SHUT_RDWR);
    return 0;
}

int waitNamedPipe(const std::string& inSystemName, int inTimeoutMs)
{
    std::string socketPath, lockPath;
    if (const int error = paths(inSystemName, socketPath, lockPath))
        return error;
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::milliseconds(inTimeoutMs);
    for (;;) {
        if (serverIsLive(socketPath, lockPath))
            return 0;
        if (std::chrono::steady_clock::now() >= deadline)
            return ETIMEDOUT;
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
}

int openNamedPipeForReading(const std::string& inSystemName, PipeHandle& outPipe)
{
    outPipe = kInvalidHandle;
    auto object = std::make_shared<PipeObject>();
    if (const int error = paths(inSystemName, object->socketPath, object->lockPath))
        return error;
    // Non-blocking connect: a full queue means busy, not an endless wait.
    const int fd = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
    if (fd < 0)
        return errno;
    object->connFd = fd; // closed with the object
    const sockaddr_un address = addressOf(object->socketPath);
    if (connect(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
        const int error = errno;
        if (!serverIsLive(object->socketPath, object->lockPath))
            return ENOENT;
        return error == ECONNREFUSED || error == EAGAIN ? EBUSY : error;
    }
    if (fcntl(fd, F_SETFL, fcntl(fd, F_GETFL) & ~O_NONBLOCK) != 0)
        return errno;
    outPipe = table().add(std::move(object));
    return 0;
}

namespace {

// One transfer on the connected descriptor, repeated when a signal interrupts it. The object
// keeps the descriptor open while inCall runs.
template <typename Call>
int transfer(PipeHandle inPipe, bool inWriting, unsigned inSize, unsigned& outDone, Call inCall)
{
    outDone = 0;
    const std::shared_ptr<PipeObject> object = find(inPipe);
    if (!object || (inWriting && !object->server))
        return EBADF; // also a write on the client end, which is opened for reading only
    const int fd = object->connFd;
    if (fd == UniqueFd::kNone)
        return ENOTCONN;
    if (inSize == 0)
        return 0;
    for (;;) {
        const ssize_t done = inCall(fd);
        if (done > 0 || (done == 0 && inWriting)) {
            outDone = static_cast<unsigned>(done);
            return 0;
        }
        if (done == 0)
            return EPIPE; // the writer has gone
        if (errno != EINTR)
            return errno;
    }
}

} // namespace

int readPipe(PipeHandle inPipe, void* outBuffer, unsigned inSize, unsigned& outRead)
{
    return transfer(inPipe, false, inSize, outRead,
                    [&](int inFd) { return recv(inFd, outBuffer, inSize, 0); });
}

int writePipe(PipeHandle inPipe, const void* inBuffer, unsigned inSize, unsigned& outWritten)
{
    // MSG_NOSIGNAL: a reader that has gone is an error code, not SIGPIPE.
    return transfer(inPipe, true, inSize, outWritten,
                    [&](int inFd) { return send(inFd, inBuffer, inSize, MSG_NOSIGNAL); });
}

int flushPipe(PipeHandle inPipe)
{
    // Sent bytes wait in the reader's queue and survive our close: nothing to flush.
    return find(inPipe) ? 0 : EBADF;
}

int closePipe(PipeHandle inPipe)
{
    std::shared_ptr<PipeObject> object;
    if (!table().take(inPipe, object))
        return EBADF;
    object->closed = true;
    // Wake a transfer or an accept blocked in another thread; the descriptors close with the
    // last user. Data already sent stays readable for the peer.
    if (const int conn = object->connFd; conn != UniqueFd::kNone)
        shutdown(conn, SHUT_RDWR);
    if (const int listener = object->listenFd; listener != UniqueFd::kNone)
        shutdown(listener, SHUT_RDWR);
    // The files go now; the lock goes with the descriptor, which a new server of the name never
    // meets, since it makes a new lock file.
    std::lock_guard<std::mutex> lock(object->mutex);
    if (object->server) {
        unlink(object->socketPath.c_str());
        unlink(object->lockPath.c_str());
    }
    return 0;
}

} // namespace ZuPlatform
