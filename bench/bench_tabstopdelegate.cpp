// Cost of painting cells with ZuTabstopItemDelegate against a plain QItemDelegate.
//
//   bench_tabstopdelegate <plain|proxy|tabstop> <cells>
//
// paints <cells> cells of a 10,000-row model (three tab-separated fields in column 0) into an
// image, row after row, as a view scrolled through all of it would. Instruction counts come
// from run_tabstopdelegate_callgrind.sh, which runs each mode with 0 and N cells under
// callgrind and subtracts; the wall time printed here is for information only.
#include "zubase/ZuTabstopItemDelegate.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QImage>
#include <QPainter>
#include <QStandardItemModel>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

int main(int argc, char** argv)
{
    if (argc != 3) {
        std::fprintf(stderr, "usage: bench_tabstopdelegate <plain|proxy|tabstop> <cells>\n");
        return 2;
    }
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    const char* mode = argv[1];
    const long cells = std::atol(argv[2]);

    const int rows = 10000;
    QStandardItemModel model(rows, 1);
    for (int row = 0; row < rows; ++row)
        model.setData(model.index(row, 0), QStringLiteral("Name%1^Given\t%2\t19%3-Mar-02")
                                               .arg(row)
                                               .arg(row * 37 % 100000)
                                               .arg(row % 100, 2, 10, QLatin1Char('0')));
    std::unique_ptr<QItemDelegate> delegate;
    if (std::strcmp(mode, "plain") == 0) {
        delegate = std::make_unique<QItemDelegate>();
    } else {
        auto* tabstops = new ZuTabstopItemDelegate;
        tabstops->createIdentityProxyModel(&model);
        if (std::strcmp(mode, "tabstop") == 0)
            tabstops->setTabPatternForColumn(0, QStringLiteral("Name0000^Given\t99999"));
        delegate.reset(tabstops);
    }

    QImage image(400, 24, QImage::Format_ARGB32_Premultiplied);
    QPainter painter(&image);
    QStyleOptionViewItem option;
    option.rect = image.rect();
    option.font = QApplication::font();
    option.fontMetrics = QFontMetrics(option.font);
    option.palette = QApplication::palette();
    option.state = QStyle::State_Enabled | QStyle::State_Active;
    option.displayAlignment = Qt::AlignLeft | Qt::AlignVCenter;
    QElapsedTimer clock;
    clock.start();
    image.fill(Qt::white);
    // Cells are painted over each other: clearing the image would add its own cost to both.
    for (long cell = 0; cell < cells; ++cell)
        delegate->paint(&painter, option, model.index(int(cell % rows), 0));
    const qint64 elapsed = clock.nsecsElapsed();
    std::printf("%s: %ld cells, %.1f ns/cell\n", mode, cells,
                cells ? double(elapsed) / cells : 0.0);
    return 0;
}
