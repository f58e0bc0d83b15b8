// Cost of one frame of ZuAnimatedProgressIcon against the bare calls of its setters, for
// 1,000 and 10,000 registered places, and the event-loop wake-ups with and without
// registrations.
//
//   bench_progressicon        prints the figures and the ratios
//
// Times are the CPU time of the GUI thread; the frame interval (100 ms) is not counted.
#include "zubase/ZuAnimatedProgressIcon.h"

#include <QAbstractEventDispatcher>
#include <QApplication>
#include <QEventLoop>
#include <QTimer>

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <functional>
#include <vector>

namespace {

double threadCpuMicroseconds()
{
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return now.tv_sec * 1e6 + now.tv_nsec / 1e3;
}

// Runs the event loop for inMilliseconds and counts its wake-ups.
int wakeUps(int inMilliseconds)
{
    int count = 0;
    auto connection = QObject::connect(QAbstractEventDispatcher::instance(),
                                       &QAbstractEventDispatcher::awake, [&count] { ++count; });
    QEventLoop loop;
    QTimer::singleShot(inMilliseconds, &loop, &QEventLoop::quit);
    loop.exec();
    QObject::disconnect(connection);
    return count;
}

long sCalls = 0;
double sFrameStart = 0;
std::vector<double> sFrameCosts;

// Median CPU time of one frame with inPlaces registered places (first setter to last).
double frameCost(int inPlaces, int inFrames)
{
    std::vector<char> places(inPlaces);
    sFrameCosts.clear();
    for (int i = 0; i < inPlaces; ++i) {
        const bool first = i == 0, last = i == inPlaces - 1;
        ZuAnimatedProgressIcon::setIconTo(&places[i], [first, last](const QIcon&) {
            ++sCalls;
            if (first)
                sFrameStart = threadCpuMicroseconds();
            if (last)
                sFrameCosts.push_back(threadCpuMicroseconds() - sFrameStart);
        });
    }
    QEventLoop loop;
    QTimer poll;
    QObject::connect(&poll, &QTimer::timeout, [&] {
        if (int(sFrameCosts.size()) >= inFrames)
            loop.quit();
    });
    poll.start(20);
    loop.exec();
    for (char& place : places)
        ZuAnimatedProgressIcon::removeIconFrom(&place);
    std::sort(sFrameCosts.begin(), sFrameCosts.end());
    return sFrameCosts[sFrameCosts.size() / 2];
}

// The floor: the same setters called straight from a vector.
double bareCost(int inPlaces, int inRounds)
{
    std::vector<std::function<void(const QIcon&)>> setters(inPlaces,
                                                           [](const QIcon&) { ++sCalls; });
    const QIcon icon;
    std::vector<double> costs;
    for (int round = 0; round < inRounds; ++round) {
        const double start = threadCpuMicroseconds();
        for (const auto& setter : setters)
            setter(icon);
        costs.push_back(threadCpuMicroseconds() - start);
    }
    std::sort(costs.begin(), costs.end());
    return costs[costs.size() / 2];
}

} // namespace

int main(int argc, char** argv)
{
    qputenv("QT_QPA_PLATFORM",
            qgetenv("QT_QPA_PLATFORM").isEmpty() ? "offscreen" : qgetenv("QT_QPA_PLATFORM"));
    QApplication app(argc, argv);
    const int frames = 15;
    const double small = frameCost(1000, frames), large = frameCost(10000, frames);
    const double bareSmall = bareCost(1000, 200), bareLarge = bareCost(10000, 200);
    std::printf("one frame, median of %d (CPU microseconds):\n", frames);
    std::printf("  1,000 places   %9.1f   (bare setter calls %7.1f, ratio %.2f)\n", small,
                bareSmall, small / bareSmall);
    std::printf("  10,000 places  %9.1f   (bare setter calls %7.1f, ratio %.2f)\n", large,
                bareLarge, large / bareLarge);
    std::printf("growth 10,000 / 1,000 places  %.2f  (linear: about 10)\n", large / small);

    char place = 0;
    const int idle = wakeUps(1000);
    ZuAnimatedProgressIcon::setIconTo(&place, [](const QIcon&) {});
    const int busy = wakeUps(1000);
    ZuAnimatedProgressIcon::removeIconFrom(&place);
    const int idleAgain = wakeUps(1000);
    std::printf("event-loop wake-ups per second: nothing registered %d, one place %d, "
                "after its removal %d\n",
                idle, busy, idleAgain);
    return 0;
}
