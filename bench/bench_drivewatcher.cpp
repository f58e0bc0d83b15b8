// Wake-ups of ZuRemovableDeviceWatcher at rest against a naive watcher that reads the mount
// table once a second, each over the same time in the same run.
//
//   bench_drivewatcher [seconds]      default 10
//
// A wake-up is a voluntary context switch of the main thread (getrusage RUSAGE_THREAD); the
// event loop's own count (QAbstractEventDispatcher::awake) is shown beside it. The timer that
// ends each run wakes it once. Mounts made by other programs meanwhile wake the watcher too:
// they are counted apart.
#include "zubase/ZuRemovableDeviceWatcher.h"

#include <QAbstractEventDispatcher>
#include <QCoreApplication>
#include <QEventLoop>
#include <QFile>
#include <QSocketNotifier>
#include <QTimer>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <sys/resource.h>

namespace {

struct WakeUps
{
    long switches = 0;
    int loopWakeUps = 0;
};

long voluntarySwitches()
{
    rusage usage{};
    getrusage(RUSAGE_THREAD, &usage);
    return usage.ru_nvcsw;
}

WakeUps idleFor(int inMilliseconds)
{
    WakeUps counted;
    auto connection =
        QObject::connect(QAbstractEventDispatcher::instance(), &QAbstractEventDispatcher::awake,
                         [&counted] { ++counted.loopWakeUps; });
    QEventLoop loop;
    QTimer::singleShot(inMilliseconds, &loop, &QEventLoop::quit);
    const long before = voluntarySwitches();
    loop.exec();
    counted.switches = voluntarySwitches() - before;
    QObject::disconnect(connection);
    return counted;
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    const int seconds = argc > 1 ? std::max(1, std::atoi(argv[1])) : 10;

    int changesSeen = 0;
    WakeUps watching;
    {
        ZuRemovableDeviceWatcher watcher;
        if (auto* notifier = watcher.findChild<QSocketNotifier*>())
            QObject::connect(notifier, &QSocketNotifier::activated,
                             [&changesSeen] { ++changesSeen; });
        watching = idleFor(seconds * 1000);
    }

    qint64 bytesRead = 0;
    WakeUps polling;
    {
        QTimer poll;
        QObject::connect(&poll, &QTimer::timeout, [&bytesRead] {
            QFile table(QStringLiteral("/proc/self/mountinfo"));
            if (table.open(QIODevice::ReadOnly))
                bytesRead += table.readAll().size();
        });
        poll.start(1000);
        polling = idleFor(seconds * 1000);
    }

    std::printf("wake-ups over %d s (context switches / event-loop wake-ups):\n", seconds);
    std::printf("  watcher at rest     %5ld / %5d   (mount-table changes by others: %d)\n",
                watching.switches, watching.loopWakeUps, changesSeen);
    std::printf("  1 s polling loop    %5ld / %5d   (%lld bytes of mount table read)\n",
                polling.switches, polling.loopWakeUps, static_cast<long long>(bytesRead));
    std::printf("ratio watcher / polling (context switches): %.2f\n",
                polling.switches ? double(watching.switches) / polling.switches : 0.0);
    return 0;
}
