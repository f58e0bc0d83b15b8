// DICOM node items: applying a filter and reading the checked names for 1,000 and 10,000
// nodes (linear growth), each against a plain loop over the tree's items doing the same, in
// one run. Every run starts with cold caches, as a user's single action does; warm, 1,000
// nodes fit the CPU caches and 10,000 do not, which would show as growth that is not ours.
//
//   bench_dicomnodeitems [nodes]   the larger size, 10000 by default
#include "zubase/ZuDicomNodeItems.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QTreeWidget>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <vector>

namespace {

volatile int sSink = 0; // keeps results alive

// Microseconds of one run of inWork after the caches were flushed.
double coldRun(const std::function<void()>& inWork)
{
    static std::vector<char> flush(64 * 1024 * 1024);
    for (size_t i = 0; i < flush.size(); i += 64)
        flush[i] = char(flush[i] + 1);
    QElapsedTimer timer;
    timer.start();
    inWork();
    return timer.nsecsElapsed() / 1e3;
}

struct Timings
{
    double filter = 1e300;
    double plainFilter = 1e300;
    double names = 1e300;
    double plainNames = 1e300;
};

Timings measure(int inNodes)
{
    // Two trees alike, one managed here and one for the plain loops.
    QTreeWidget managed;
    QTreeWidget plain;
    ZuDicomNodeItems nodes;
    nodes.setTreeWidget(&managed);
    ZuDicomNodeItems plainNodes;
    plainNodes.setTreeWidget(&plain);
    for (int i = 0; i < inNodes; ++i) {
        const QString name = QStringLiteral("NODE_%1_AE").arg(i, 6, 10, QLatin1Char('0'));
        const Qt::CheckState state = i % 10 == 0 ? Qt::Checked : Qt::Unchecked;
        nodes.addDicomNode(name)->setCheckState(0, state);
        plainNodes.addDicomNode(name)->setCheckState(0, state);
    }
    // Each run shows and hides a different part of the list, as typing into a filter does.
    const QStringList filters = {QStringLiteral("1"), QStringLiteral("node_0"), QString(),
                                 QStringLiteral("23")};
    Timings timings;
    // Interleaved, so that load from elsewhere on the machine hits all sides alike; the best
    // run is the one least disturbed.
    for (int run = 0; run < 12; ++run) {
        const QString& filter = filters.at(run % filters.size());
        timings.filter = std::min(timings.filter, coldRun([&] { nodes.applyFilter(filter); }));
        timings.plainFilter =
            std::min(timings.plainFilter, coldRun([&] {
                         for (int row = 0; row < plain.topLevelItemCount(); ++row) {
                             QTreeWidgetItem* item = plain.topLevelItem(row);
                             item->setHidden(item->checkState(0) != Qt::Checked &&
                                             !item->text(0).contains(filter, Qt::CaseInsensitive));
                         }
                     }));
        timings.names = std::min(
            timings.names, coldRun([&] { sSink = sSink + nodes.selectedDicomNodes().size(); }));
        timings.plainNames =
            std::min(timings.plainNames, coldRun([&] {
                         QStringList names;
                         for (int row = 0; row < plain.topLevelItemCount(); ++row) {
                             if (plain.topLevelItem(row)->checkState(0) == Qt::Checked)
                                 names << plain.topLevelItem(row)->text(0);
                         }
                         sSink = sSink + names.size();
                     }));
    }
    return timings;
}

} // namespace

int main(int argc, char** argv)
{
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication application(argc, argv);
    const int count = argc > 1 ? std::max(1000, std::atoi(argv[1])) : 10000;
    const Timings small = measure(1000);
    const Timings large = measure(count);
    const double linear = count / 1000.0;
    for (const auto& [nodes, t] : {std::make_pair(1000, small), std::make_pair(count, large)})
        std::printf("%6d nodes: filter %.0f us (plain loop %.0f us), checked names %.0f us "
                    "(plain loop %.0f us)\n",
                    nodes, t.filter, t.plainFilter, t.names, t.plainNames);
    std::printf("RATIO filter %d / 1000 nodes: %.1f (linear: %.0f; plain loop %.1f)\n", count,
                large.filter / small.filter, linear, large.plainFilter / small.plainFilter);
    std::printf("RATIO checked names %d / 1000 nodes: %.1f (linear: %.0f; plain loop %.1f)\n",
                count, large.names / small.names, linear, large.plainNames / small.plainNames);
    std::printf("RATIO filter / plain loop at %d nodes: %.2f (goal <= 1.5)\n", count,
                large.filter / large.plainFilter);
    return 0;
}
