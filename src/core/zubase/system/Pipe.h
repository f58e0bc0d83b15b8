#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkResult.h"
#include "rklib/RkThread.h"

#include <QString>

#include <atomic>
#include <cstdint>
#include <memory>

namespace ZuBase {

// One end of a local named pipe "\\.\pipe\<name>" between two processes of the same user. The
// server end creates the pipe and accepts one client; the client end opens it for reading only,
// so data flows from the server to the client. read() and write() move exactly the bytes asked
// for; the stream carries no framing of its own.
class ZUBASE_EXPORT Pipe
{
public:
    explicit Pipe(bool inIsServer);
    // Copies share the one system handle; it is closed by close() on any copy or when the last
    // copy is destroyed, never twice.
    Pipe(const Pipe& inOther);
    Pipe& operator=(const Pipe& inOther);
    ~Pipe();

    void nameSet(const QString& inName);
    QString name() const;

    // Creates the server end; fails while another server offers the same name.
    RkResult createOnServer();
    // Waits up to 1000 ms for the client; a client that came first counts as connected.
    RkResult acceptOnServer();
    // Opens the client end, giving the server up to 5000 ms to appear. No such pipe is a bad
    // result without a failure record.
    RkResult connectOnClient();
    // Reads exactly inSize bytes; on failure the bytes already read stay in outBuffer.
    RkResult read(void* outBuffer, unsigned int inSize);
    // Writes exactly inSize bytes.
    RkResult write(const void* inBuffer, unsigned int inSize);
    // Closes the handle; the object can be used again. Harmless without a handle.
    void close();

    bool isServer() const { return mServer; }
    bool isClient() const { return !mServer; }
    bool isConnected() const { return mConnected; }
    bool isCreated() const;

private:
    struct SharedHandle;
    std::intptr_t handle() const;
    void setHandle(std::intptr_t inHandle);

    bool mServer;
    std::atomic<bool> mConnected{false}; // written by the serving thread, read by the owner
    QString mName;
    std::shared_ptr<SharedHandle> mHandle;
};

// A thread that creates the server end of a pipe and keeps accepting its client in the
// background, at most one pass per second. The destructor returns within about a second.
class ZUBASE_EXPORT PipeServer : public RkThread
{
public:
    PipeServer();
    // Copies take the pipe and the stop flag; a copy has a thread of its own, not started.
    PipeServer(const PipeServer& inOther);
    PipeServer& operator=(const PipeServer& inOther);
    ~PipeServer() override;

    // Creates the server end of inPipe (not owned) and starts the thread when that succeeded.
    RkResult pipeSet(Pipe& inPipe);
    void run() override;

private:
    Pipe* mPipe = nullptr;
    std::atomic<bool> mStop{false};
};

} // namespace ZuBase
