// Find/replace on large documents: marking all matches (Find All) and then Replace All on
// 256 KiB and 1 MiB of text; the ratio of the two sizes shows whether the work grows linearly.
// A bare QTextDocument::find loop over the same text is the baseline for marking.
#include "zubase/ZuFindReplaceDialog.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QLineEdit>
#include <QTextEdit>

#include <cstdio>

namespace {

// Report-like lines of 64 characters, one match of "needle" in each.
QString document(int inBytes)
{
    const QString line = QStringLiteral("Series %1: contrast phase, needle at slice %2, ok.");
    QString text;
    text.reserve(inBytes + 128);
    for (int i = 0; text.size() < inBytes; ++i)
        text += line.arg(i % 1000, 4, 10, QLatin1Char('0')).arg(i % 97, 3).leftJustified(63) + '\n';
    return text;
}

struct Timings
{
    double findLoop = 1e300;
    double markAll = 1e300;
    double replaceAll = 1e300;
    int matches = 0;
};

double millisecondsOf(const std::function<void()>& inWork)
{
    QElapsedTimer timer;
    timer.start();
    inWork();
    return timer.nsecsElapsed() / 1e6;
}

void measure(int inBytes, Timings& ioTimings)
{
    const QString text = document(inBytes);
    const QString needle = QStringLiteral("needle");
    QTextEdit edit;
    edit.resize(800, 600);
    edit.setPlainText(text);
    ZuFindReplaceDialog dialog(&edit);
    dialog.setDocument(&edit);
    dialog.findChildren<QLineEdit*>().first()->setText(needle);

    ioTimings.findLoop =
        std::min(ioTimings.findLoop, millisecondsOf([&] {
                     int found = 0;
                     QTextCursor cursor(edit.document());
                     while (!(cursor = edit.document()->find(needle, cursor)).isNull())
                         ++found;
                     ioTimings.matches = found;
                 }));
    ioTimings.markAll =
        std::min(ioTimings.markAll,
                 millisecondsOf([&] { QMetaObject::invokeMethod(&dialog, "findAllClicked"); }));
    if (edit.extraSelections().size() != ioTimings.matches)
        std::printf("ERROR: %d marks for %d matches\n", edit.extraSelections().size(),
                    ioTimings.matches);
    // As a user would: mark all, then replace them all.
    ioTimings.replaceAll = std::min(ioTimings.replaceAll, millisecondsOf([&] {
                                        dialog.replaceAll(needle, QStringLiteral("pin"),
                                                          Qt::CaseInsensitive, false, false);
                                    }));
    if (edit.document()->find(needle).hasSelection())
        std::printf("ERROR: a match was left\n");
}

} // namespace

int main(int argc, char** argv)
{
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication application(argc, argv);
    Timings small;
    Timings large;
    // Interleaved, so that load from elsewhere on the machine hits both sizes alike.
    for (int run = 0; run < 4; ++run) {
        measure(256 * 1024, small);
        measure(1024 * 1024, large);
    }
    for (const auto& [name, t] : {std::make_pair("256 KiB", small), std::make_pair("1 MiB", large)})
        std::printf(
            "%-7s (%5d matches): find loop %.1f ms, mark all %.1f ms, replace all %.1f ms\n", name,
            t.matches, t.findLoop, t.markAll, t.replaceAll);
    std::printf("RATIO mark all 1 MiB / 256 KiB: %.1f (linear: 4; find loop %.1f)\n",
                large.markAll / small.markAll, large.findLoop / small.findLoop);
    std::printf("RATIO replace all 1 MiB / 256 KiB: %.1f (linear: 4)\n",
                large.replaceAll / small.replaceAll);
    std::printf("RATIO mark all / find loop at 1 MiB: %.2f\n", large.markAll / large.findLoop);
    return 0;
}
