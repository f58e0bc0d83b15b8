// Test helper: the other process of a named pipe, built on the library.
//   zu_pipe_peer client <name> <size>          reads <size> bytes; exits 0 when they are the
//                                              pattern, 1 when not, 2 on failure
//   zu_pipe_peer client-die <name> <size>      reads <size> bytes, then dies without a word
//   zu_pipe_peer server <name> <size> [piece]  writes <size> bytes (in pieces of <piece> bytes
//                                              with a pause between), waits for the reader to go
//   zu_pipe_peer server-die <name> <size>      writes <size> bytes, then dies at once
#include "zubase/Pipe.h"

#include <QByteArray>
#include <QString>

#include <algorithm>
#include <cstdlib>

#include <unistd.h>

int main(int argc, char** argv)
{
    if (argc < 4)
        return 2;
    const QByteArray mode = argv[1];
    const int size = std::atoi(argv[3]);
    QByteArray pattern(size, '\0');
    for (int i = 0; i < size; ++i)
        pattern[i] = static_cast<char>((i * 31 + i / 251) & 0xFF);
    ZuBase::Pipe pipe(!mode.startsWith("client"));
    pipe.nameSet(QString::fromLocal8Bit(argv[2]));
    if (pipe.isClient()) {
        QByteArray got(size, '\0');
        if (pipe.connectOnClient().isBad() || pipe.read(got.data(), unsigned(size)).isBad())
            return 2;
        if (mode == "client-die")
            _exit(0);
        return got == pattern ? 0 : 1;
    }
    if (pipe.createOnServer().isBad())
        return 2;
    while (pipe.acceptOnServer().isBad()) {
    }
    const int piece = argc > 4 ? std::atoi(argv[4]) : size;
    for (int done = 0; done < size; done += piece) {
        if (done > 0)
            usleep(20000); // the reader sees the pieces arrive separately
        if (pipe.write(pattern.constData() + done, unsigned(std::min(piece, size - done))).isBad())
            return 2;
    }
    if (mode == "server-die")
        _exit(0);
    char byte; // keep the pipe until the reader has gone, as a server would
    pipe.read(&byte, 1);
    return 0;
}
