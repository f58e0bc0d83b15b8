// Cost of ZuApplication::notify against a plain QApplication, and of the deferred-delete check.
//
//   bench_notify dispatch <plain|zu|zuhooks> <events>   sends <events> user events to a QObject
//   bench_notify deferred                                times the deferred-delete check
//
// Instruction counts come from run_notify_callgrind.sh, which runs the dispatch mode under
// callgrind with 0 and 1,000,000 events and subtracts; the wall time printed here is for
// information only (shared machines are too noisy for a few per cent).
#include "zubase/ZuApplication.h"

#include "rklib/RkLogFile.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QEvent>
#include <QObject>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <memory>
#include <vector>

namespace {

const QEvent::Type sBenchEvent = QEvent::Type(QEvent::User + 7);

class Sink : public QObject
{
public:
    bool event(QEvent* inEvent) override
    {
        if (inEvent->type() == sBenchEvent) {
            ++count;
            if (onEvent)
                onEvent();
            return true;
        }
        return QObject::event(inEvent);
    }
    long count = 0;
    std::function<void()> onEvent;
};

class NoOpHook : public ZuApplication::HookNotify
{
public:
    void beforeNotify(QObject*, QEvent*) override {}
    void afterNotify(QObject*, QEvent*) override {}
};

int dispatch(int argc, char** argv, char** envp, const char* inMode, long inEvents)
{
    const bool plain = std::strcmp(inMode, "plain") == 0;
    const bool hooks = std::strcmp(inMode, "zuhooks") == 0;
    std::unique_ptr<QApplication> app;
    if (plain)
        app.reset(new QApplication(argc, argv));
    else
        app.reset(ZuApplication::createInstance(argc, argv, envp));
    NoOpHook hook[3];
    if (hooks) {
        for (NoOpHook& h : hook)
            ZuApplication::installHookNotify(&h);
    }

    Sink sink;
    QEvent event(sBenchEvent);
    QElapsedTimer timer;
    timer.start();
    for (long i = 0; i < inEvents; ++i)
        QCoreApplication::sendEvent(&sink, &event);
    const qint64 ns = timer.nsecsElapsed();
    std::printf("%s events %ld delivered %ld ns/event %.2f\n", inMode, inEvents, sink.count,
                inEvents ? double(ns) / double(inEvents) : 0.0);
    if (hooks) {
        for (NoOpHook& h : hook)
            ZuApplication::deInstallHookNotify(&h);
    }
    return sink.count == inEvents ? 0 : 1;
}

// Builds a tree of inSize objects below a root (fan-out 10), obstructs its deletion through the
// last object in walk order, nests inDepth dispatches and times repeated deletion attempts.
double deferredCheck(long inSize, int inDepth, int inRepeats)
{
    auto* root = new QObject;
    std::vector<QObject*> level{root};
    long made = 0;
    QObject* last = root;
    while (made < inSize) {
        std::vector<QObject*> next;
        for (QObject* parent : level) {
            for (int i = 0; i < 10 && made < inSize; ++i, ++made)
                next.push_back(new QObject(parent));
        }
        level.swap(next);
    }
    // Last in depth-first pre-order: follow the last child down.
    while (!last->children().isEmpty())
        last = last->children().constLast();

    // The obstructing descendant handles an event at level 0; others nest above it.
    std::vector<std::unique_ptr<Sink>> nest(static_cast<size_t>(inDepth - 1));
    double nsPerAttempt = 0;
    for (auto& s : nest)
        s.reset(new Sink);
    for (size_t i = 0; i + 1 < nest.size(); ++i) {
        Sink* next = nest[i + 1].get();
        nest[i]->onEvent = [next] {
            QEvent event(sBenchEvent);
            QCoreApplication::sendEvent(next, &event);
        };
    }
    auto attempts = [&] {
        QElapsedTimer timer;
        timer.start();
        for (int r = 0; r < inRepeats; ++r) {
            root->deleteLater();
            QCoreApplication::sendPostedEvents(root, QEvent::DeferredDelete);
        }
        nsPerAttempt = double(timer.nsecsElapsed()) / inRepeats;
    };
    if (!nest.empty())
        nest.back()->onEvent = attempts;
    // "last" handles the first event (level 0); the sinks nest above it, the check runs at
    // notify depth inDepth.
    struct Filter : QObject
    {
        std::function<void()> inside;
        bool eventFilter(QObject*, QEvent* inEvent) override
        {
            if (inEvent->type() != sBenchEvent)
                return false;
            inside();
            return true;
        }
    } filter;
    Sink* first = nest.empty() ? nullptr : nest.front().get();
    filter.inside = [&] {
        if (!first) {
            attempts();
            return;
        }
        QEvent event(sBenchEvent);
        QCoreApplication::sendEvent(first, &event);
    };
    last->installEventFilter(&filter);
    QEvent start(sBenchEvent);
    QCoreApplication::sendEvent(last, &start);
    last->removeEventFilter(&filter);
    if (ZuApplication::callDepth_of_notify() != 0)
        std::abort();
    delete root; // also drops the re-posted deletion
    return nsPerAttempt;
}

int deferred(int argc, char** argv, char** envp)
{
    ZuApplication::createInstance(argc, argv, envp);
    getTheLogInstance().setOutputLevel(RkLogOff);
    // Use up the 5000 reports first, so that only the check itself is timed.
    deferredCheck(10, 2, 5001);
    std::printf("deferred-delete check, tree fan-out 10, obstructed by the last object:\n");
    struct Case
    {
        long size;
        int depth;
    };
    const Case cases[] = {{1000, 50}, {10000, 50}, {100000, 50}, {10000, 1}, {10000, 500}};
    for (const Case& c : cases) {
        const int repeats = c.size >= 100000 ? 20 : 200;
        const double ns = deferredCheck(c.size, c.depth, repeats);
        std::printf("  tree %6ld  depth %3d  %10.0f ns/check  %6.2f ns/object\n", c.size, c.depth,
                    ns, ns / double(c.size + 1));
    }
    delete QCoreApplication::instance();
    return 0;
}

} // namespace

int main(int argc, char** argv, char** envp)
{
    if (argc >= 4 && std::strcmp(argv[1], "dispatch") == 0)
        return dispatch(argc, argv, envp, argv[2], std::atol(argv[3]));
    if (argc >= 2 && std::strcmp(argv[1], "deferred") == 0)
        return deferred(argc, argv, envp);
    std::fprintf(stderr, "usage: bench_notify dispatch <plain|zu|zuhooks> <events>\n"
                         "       bench_notify deferred\n");
    return 2;
}
