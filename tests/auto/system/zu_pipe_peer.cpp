// Test helper: the other process of a named pipe, built on the library.
//   zu_pipe_peer client <name> <size>         connects, reads <size> bytes, exits 0 when they
//                                            are the expected pattern, 1 when not, 2 on failure
//   zu_pipe_peer client-die <name> <size>    connects, reads <size> bytes, dies without a word
//   zu_pipe_peer server <name> <size> [piece] serves, writes <size> bytes (in pieces of <piece>
//                                            bytes with a pause between), waits for the reader
//   zu_pipe_peer server-die <name> <size>    serves, writes <size> bytes, dies at once
#include "zubase/Pipe.h"

#include <QByteArray>
#include <QString>

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include <unistd.h>

namespace {

QByteArray pattern(int inSize)
{
    QByteArray bytes(inSize, '\0');
    for (int i = 0; i < inSize; ++i)
        bytes[i] = static_cast<char>((i * 31 + i / 251) & 0xFF);
    return bytes;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 4)
        return 2;
    const QByteArray mode = argv[1];
    const QString name = QString::fromLocal8Bit(argv[2]);
    const int size = std::atoi(argv[3]);
    if (mode.startsWith("client")) {
        ZuBase::Pipe pipe(false);
        pipe.nameSet(name);
        if (pipe.connectOnClient().isBad())
            return 2;
        QByteArray got(size, '\0');
        if (pipe.read(got.data(), static_cast<unsigned>(size)).isBad())
            return 2;
        if (mode == "client-die")
            _exit(0);
        return got == pattern(size) ? 0 : 1;
    }
    ZuBase::Pipe pipe(true);
    pipe.nameSet(name);
    if (pipe.createOnServer().isBad())
        return 2;
    while (pipe.acceptOnServer().isBad()) {
    }
    const QByteArray data = pattern(size);
    const int piece = argc > 4 ? std::atoi(argv[4]) : size;
    for (int done = 0; done < size; done += piece) {
        if (done > 0)
            usleep(20000); // the reader sees the pieces arrive separately
        const int count = std::min(piece, size - done);
        if (pipe.write(data.constData() + done, static_cast<unsigned>(count)).isBad())
            return 2;
    }
    if (mode == "server-die")
        _exit(0);
    // Keep the pipe until the reader has gone, as a server would.
    char byte;
    pipe.read(&byte, 1);
    return 0;
}
