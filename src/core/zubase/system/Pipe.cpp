#include "zubase/Pipe.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/platform/SysPipe.h"

#include <cerrno>
#include <chrono>

namespace ZuBase {

namespace {

constexpr int kAcceptTimeout = 1000;
constexpr int kConnectTimeout = 5000;
constexpr std::chrono::milliseconds kServePace(1000);
constexpr unsigned long kStopCheckInterval = 20;

std::string systemName(const QString& inName)
{
    return Q2M(QStringLiteral("\\\\.\\pipe\\%1").arg(inName)).toStdString();
}

} // namespace

// The single owner of the system handle shared by copies of a Pipe.
struct Pipe::SharedHandle
{
    ~SharedHandle()
    {
        const std::intptr_t handle = value.exchange(ZuPlatform::kInvalidHandle);
        if (handle != ZuPlatform::kInvalidHandle) {
            ZuPlatform::flushPipe(handle);
            ZuPlatform::closePipe(handle);
        }
    }
    std::atomic<std::intptr_t> value{ZuPlatform::kInvalidHandle};
};

Pipe::Pipe(bool inIsServer) : mServer(inIsServer), mHandle(std::make_shared<SharedHandle>()) {}

Pipe::Pipe(const Pipe& inOther)
    : mServer(inOther.mServer), mConnected(inOther.mConnected.load()), mName(inOther.mName),
      mHandle(inOther.mHandle)
{}

Pipe& Pipe::operator=(const Pipe& inOther)
{
    if (this != &inOther) {
        mServer = inOther.mServer;
        mConnected = inOther.mConnected.load();
        mName = inOther.mName;
        mHandle = inOther.mHandle;
    }
    return *this;
}

Pipe::~Pipe()
{
    mConnected = false;
}

std::intptr_t Pipe::handle() const
{
    return mHandle->value;
}

void Pipe::setHandle(std::intptr_t inHandle)
{
    mHandle->value = inHandle;
}

void Pipe::nameSet(const QString& inName)
{
    mName = inName;
}

QString Pipe::name() const
{
    return mName;
}

bool Pipe::isCreated() const
{
    return handle() != ZuPlatform::kInvalidHandle;
}

RkResult Pipe::createOnServer()
{
    RkResult res;
    close(); // a handle of an earlier creation would otherwise leak and block the name
    ZuPlatform::PipeHandle created = ZuPlatform::kInvalidHandle;
    const int error = ZuPlatform::createNamedPipe(systemName(mName), created);
    setHandle(created);
    ZU_CHECK_WIN_RETURN(res, RK_CHECK_NE(handle(), ZuPlatform::kInvalidHandle, "::CreateNamedPipe"),
                        error);
    return res;
}

RkResult Pipe::acceptOnServer()
{
    RkResult res;
    getTheLogInstance().printf(
        "%s", Q2M(QStringLiteral("::ConnectNamedPipe() [%1]").arg(mName)).constData());
    const bool connected = ZuPlatform::connectNamedPipe(handle(), kAcceptTimeout) == 0;
    if (connected)
        getTheLogInstance().printf("pipeConnected");
    else
        res.makeBad(1);
    mConnected = connected;
    return res;
}

RkResult Pipe::connectOnClient()
{
    RkResult res;
    close(); // as for createOnServer: an earlier handle would leak
    const std::string name = systemName(mName);
    ZuPlatform::waitNamedPipe(name, kConnectTimeout); // only gives the server time to appear
    ZuPlatform::PipeHandle opened = ZuPlatform::kInvalidHandle;
    const int error = ZuPlatform::openNamedPipeForReading(name, opened);
    setHandle(opened);
    if (handle() == ZuPlatform::kInvalidHandle) {
        if (error == ENOENT)
            res.makeBad(1);
        else if (Tz::failWin(RK_CHECK_NE(handle(), ZuPlatform::kInvalidHandle, "::CreateFile"),
                             error))
            res.makeBad(1);
    }
    mConnected = res.isOk();
    return res;
}

RkResult Pipe::read(void* outBuffer, unsigned int inSize)
{
    RkResult res;
    char* buffer = static_cast<char*>(outBuffer);
    unsigned int remaining = inSize;
    while (remaining > 0) {
        unsigned int got = 0;
        const int error = ZuPlatform::readPipe(handle(), buffer, remaining, got);
        const bool transferred = error == 0; // recorded as "b"
        ZU_CHECK_WIN_RETURN(res, RK_CHECK(transferred, "b", "::ReadFile"), error);
        buffer += got;
        remaining -= got;
    }
    return res;
}

RkResult Pipe::write(const void* inBuffer, unsigned int inSize)
{
    RkResult res;
    const char* buffer = static_cast<const char*>(inBuffer);
    unsigned int written = 0;
    do {
        unsigned int sent = 0;
        const int error = ZuPlatform::writePipe(handle(), buffer + written, inSize - written, sent);
        const bool transferred = error == 0; // recorded as "b"
        ZU_CHECK_WIN_RETURN(res, RK_CHECK(transferred, "b", "::WriteFile"), error);
        written += sent;
    } while (written < inSize);
    return res;
}

void Pipe::close()
{
    const std::intptr_t closing = mHandle->value.exchange(ZuPlatform::kInvalidHandle);
    if (closing != ZuPlatform::kInvalidHandle) {
        ZuPlatform::flushPipe(closing);
        ZuPlatform::closePipe(closing);
    }
    mConnected = false;
}

PipeServer::PipeServer() = default;

PipeServer::PipeServer(const PipeServer& inOther)
    : RkThread(), mPipe(inOther.mPipe), mStop(inOther.mStop.load())
{}

PipeServer& PipeServer::operator=(const PipeServer& inOther)
{
    mPipe = inOther.mPipe;
    mStop = inOther.mStop.load();
    return *this;
}

PipeServer::~PipeServer()
{
    mStop = true;
    wait(RkThread::Forever);
}

RkResult PipeServer::pipeSet(Pipe& inPipe)
{
    mPipe = &inPipe;
    RkResult res = inPipe.createOnServer();
    if (res.isOk())
        start();
    return res;
}

void PipeServer::run()
{
    while (!mStop) {
        const auto passStart = std::chrono::steady_clock::now();
        mPipe->acceptOnServer();
        // While a client stays connected (or has gone) a pass returns at once: pace it.
        while (!mStop && std::chrono::steady_clock::now() - passStart < kServePace)
            RkThread::msleep(kStopCheckInterval);
    }
}

} // namespace ZuBase
