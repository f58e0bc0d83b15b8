// Pipe throughput between two processes: 256 MiB in 64 KiB read/write calls through
// ZuBase::Pipe, against a raw socket pair moving the same data with plain system calls.
#include "zubase/Pipe.h"

#include <QByteArray>
#include <QString>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <vector>

#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr unsigned sChunk = 64 * 1024;
constexpr long long sTotal = 256LL * 1024 * 1024;
constexpr int sRounds = 5;

using Clock = std::chrono::steady_clock;

double seconds(Clock::time_point inStart)
{
    return std::chrono::duration<double>(Clock::now() - inStart).count();
}

bool childSucceeded(pid_t inPid)
{
    int status = 0;
    while (waitpid(inPid, &status, 0) < 0) {
    }
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

// Seconds for the whole transfer through ZuBase::Pipe, or a negative value on failure.
double pipeRound(int inRound)
{
    const QString name = QStringLiteral("zubench-%1-%2").arg(getpid()).arg(inRound);
    const pid_t pid = fork();
    if (pid == 0) {
        ZuBase::Pipe client(false);
        client.nameSet(name);
        if (client.connectOnClient().isBad())
            _exit(2);
        std::vector<char> buffer(sChunk);
        for (long long done = 0; done < sTotal; done += sChunk)
            if (client.read(buffer.data(), sChunk).isBad())
                _exit(3);
        _exit(0);
    }
    ZuBase::Pipe server(true);
    server.nameSet(name);
    if (server.createOnServer().isBad())
        return -1;
    while (server.acceptOnServer().isBad()) {
    }
    std::vector<char> buffer(sChunk, 'x');
    const Clock::time_point start = Clock::now();
    for (long long done = 0; done < sTotal; done += sChunk)
        if (server.write(buffer.data(), sChunk).isBad())
            return -1;
    const bool ok = childSucceeded(pid);
    const double elapsed = seconds(start);
    return ok ? elapsed : -1;
}

// The same transfer over a socket pair with plain send() and recv().
double rawRound()
{
    int pair[2];
    if (socketpair(AF_UNIX, SOCK_STREAM, 0, pair) != 0)
        return -1;
    const pid_t pid = fork();
    if (pid == 0) {
        close(pair[0]);
        std::vector<char> buffer(sChunk);
        for (long long done = 0; done < sTotal;) {
            const ssize_t got = recv(pair[1], buffer.data(), sChunk, 0);
            if (got <= 0)
                _exit(3);
            done += got;
        }
        _exit(0);
    }
    close(pair[1]);
    std::vector<char> buffer(sChunk, 'x');
    const Clock::time_point start = Clock::now();
    for (long long done = 0; done < sTotal; done += sChunk) {
        for (unsigned sent = 0; sent < sChunk;) {
            const ssize_t n = send(pair[0], buffer.data() + sent, sChunk - sent, MSG_NOSIGNAL);
            if (n < 0)
                return -1;
            sent += static_cast<unsigned>(n);
        }
    }
    const bool ok = childSucceeded(pid);
    const double elapsed = seconds(start);
    close(pair[0]);
    return ok ? elapsed : -1;
}

double median(std::vector<double> inValues)
{
    std::sort(inValues.begin(), inValues.end());
    return inValues[inValues.size() / 2];
}

} // namespace

int main()
{
    std::vector<double> pipeTimes, rawTimes;
    for (int round = 0; round < sRounds; ++round) {
        // Alternate, so that both see the same machine load.
        const double raw = rawRound();
        const double pipe = pipeRound(round);
        if (raw <= 0 || pipe <= 0) {
            std::fprintf(stderr, "transfer failed\n");
            return 1;
        }
        rawTimes.push_back(raw);
        pipeTimes.push_back(pipe);
    }
    const double mib = double(sTotal) / (1024 * 1024);
    const double pipeRate = mib / median(pipeTimes);
    const double rawRate = mib / median(rawTimes);
    std::printf("pipe throughput, %d rounds of 256 MiB in 64 KiB calls (median)\n", sRounds);
    std::printf("  ZuBase::Pipe      %8.1f MiB/s\n", pipeRate);
    std::printf("  raw socket pair   %8.1f MiB/s\n", rawRate);
    std::printf("  ratio             %8.3f (goal >= 0.9)\n", pipeRate / rawRate);
    return 0;
}
