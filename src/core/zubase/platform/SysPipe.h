#pragma once

// Internal platform layer of ZuBase::Pipe: a named pipe is a Unix-domain stream socket in a
// directory that only the user can enter, guarded by a lock file that its live server holds.
// Qt-free; every call returns 0 or an errno-style code. A pipe that is not open is
// kInvalidHandle, as for CreateNamedPipe and CreateFile.

#include "zubase/platform/SysTypes.h"

#include <string>

namespace ZuPlatform {

using PipeHandle = Handle;

// The socket file of a system pipe name ("\\.\pipe\<name>"); creates the per-user directory.
// <dir>/<name>.pipe with the name's bytes other than letters, digits, '.', '_' and '-' as %XX;
// a name too long for a socket path becomes '~' and 32 hex digits of its SHA-256.
int pipeSocketPath(const std::string& inSystemName, std::string& outPath);

// The server end, one instance: EADDRINUSE while a live server of that name exists. A socket
// left behind by a server that died does not count.
int createNamedPipe(const std::string& inSystemName, PipeHandle& outPipe);
// Waits up to inTimeoutMs for the client. 0 at once while a client is connected, EPIPE at once
// once it has gone, ETIMEDOUT when none came (nothing stays pending).
int connectNamedPipe(PipeHandle inPipe, int inTimeoutMs);
// Waits up to inTimeoutMs until a live server offers the pipe; ETIMEDOUT else.
int waitNamedPipe(const std::string& inSystemName, int inTimeoutMs);
// The client end, for reading only. ENOENT when no live server offers the pipe, EBUSY while its
// one instance is taken.
int openNamedPipeForReading(const std::string& inSystemName, PipeHandle& outPipe);

// One transfer of up to inSize bytes; a peer that has gone gives EPIPE, never a signal.
int readPipe(PipeHandle inPipe, void* outBuffer, unsigned inSize, unsigned& outRead);
int writePipe(PipeHandle inPipe, const void* inBuffer, unsigned inSize, unsigned& outWritten);
int flushPipe(PipeHandle inPipe);
// Ends the handle; a transfer blocked on it in another thread returns.
int closePipe(PipeHandle inPipe);

} // namespace ZuPlatform
