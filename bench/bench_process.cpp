// Process start to terminated() for a child that exits at once, and its split: creation (the
// suspended child up to start()'s return), the child's run after resume() until its end is
// visible, and the wait for the 100 ms poll that reports it.
#include "zubase/Process.h"

#include "rklib/RkLogFile.h"

#include <QCoreApplication>
#include <QEventLoop>
#include <QStandardPaths>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <thread>
#include <vector>

namespace {

constexpr int sRounds = 20;
using Clock = std::chrono::steady_clock;

double ms(Clock::time_point inFrom, Clock::time_point inTo)
{
    return std::chrono::duration<double, std::milli>(inTo - inFrom).count();
}

double median(std::vector<double> inValues)
{
    std::sort(inValues.begin(), inValues.end());
    return inValues[inValues.size() / 2];
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    getTheLogInstance().setOutputLevel(RkLogOff);
    const QString exe = QStandardPaths::findExecutable("true");
    if (exe.isEmpty())
        return 1;

    std::vector<double> creation, total, run;
    for (int round = 0; round < sRounds; ++round) {
        // To terminated(): the path a host takes.
        {
            ZuBase::Process process;
            process.mExePath = exe;
            QEventLoop loop;
            QObject::connect(&process, &ZuBase::Process::terminated, &loop, &QEventLoop::quit);
            const Clock::time_point start = Clock::now();
            if (process.start(false, true, false).isBad())
                return 1;
            const Clock::time_point created = Clock::now();
            process.resume();
            loop.exec();
            const Clock::time_point ended = Clock::now();
            creation.push_back(ms(start, created));
            total.push_back(ms(start, ended));
            process.detach();
        }
        // How soon the end can be seen at all: resume, then look every 0.2 ms.
        {
            ZuBase::Process process;
            process.mExePath = exe;
            if (process.start(false, true, false).isBad())
                return 1;
            const Clock::time_point resumed = Clock::now();
            process.resume();
            while (process.isRunning())
                std::this_thread::sleep_for(std::chrono::microseconds(200));
            run.push_back(ms(resumed, Clock::now()));
            process.detach();
        }
    }
    const double c = median(creation), t = median(total), r = median(run);
    std::printf("process start to terminated(), %d rounds of %s (median)\n", sRounds,
                qPrintable(exe));
    std::printf("  start to terminated()  %8.2f ms\n", t);
    std::printf("  creation (start())     %8.2f ms\n", c);
    std::printf("  run after resume()     %8.2f ms\n", r);
    std::printf("  wait for the poll      %8.2f ms\n", t - c - r);
    return 0;
}
