// ZuProxyModelItemDelegate and ZuTabstopItemDelegate: cells painted into images.
#include "zubase/ZuProxyModelItemDelegate.h"
#include "zubase/ZuTabstopItemDelegate.h"

#include <QIdentityProxyModel>
#include <QPainter>
#include <QStandardItemModel>
#include <QtTest>

#include <memory>

namespace {

// Shows every text in capitals with a suffix, so proxied cells look different.
class Shouting : public QIdentityProxyModel
{
public:
    QVariant data(const QModelIndex& inIndex, int inRole) const override
    {
        const QVariant value = QIdentityProxyModel::data(inIndex, inRole);
        return inRole == Qt::DisplayRole ? value.toString().toUpper() + "!!!" : value;
    }
};

QFont cellFont(int inPixels = 13)
{
    QFont font("DejaVu Sans");
    font.setPixelSize(inPixels);
    return font;
}

QStyleOptionViewItem cellOption(int inWidth = 400)
{
    QStyleOptionViewItem option;
    option.rect = QRect(0, 0, inWidth, 24);
    option.font = cellFont();
    option.fontMetrics = QFontMetrics(option.font);
    option.palette = QPalette(Qt::white);
    option.palette.setColor(QPalette::Text, Qt::black);
    option.state = QStyle::State_Enabled | QStyle::State_Active;
    option.displayAlignment = Qt::AlignLeft | Qt::AlignVCenter;
    return option;
}

QImage paintCell(const QAbstractItemDelegate& inDelegate, const QModelIndex& inIndex,
                 const QStyleOptionViewItem& inOption = cellOption())
{
    QImage image(inOption.rect.size(), QImage::Format_RGB32);
    image.fill(Qt::white);
    QPainter painter(&image);
    inDelegate.paint(&painter, inOption, inIndex);
    return image;
}

QRect inkOf(const QImage& inImage)
{
    QRect box;
    for (int y = 0; y < inImage.height(); ++y)
        for (int x = 0; x < inImage.width(); ++x)
            if (qGray(inImage.pixel(x, y)) < 128)
                box |= QRect(x, y, 1, 1);
    return box;
}

} // namespace

class TstItemDelegates : public QObject
{
    Q_OBJECT
    QStandardItemModel mModel{1, 3};
    QStandardItemModel mOther{1, 3};

private Q_SLOTS:
    void init()
    {
        mModel.setData(mModel.index(0, 0), "a\tbc");
        mOther.setData(mOther.index(0, 0), "x\tyz");
    }

    // Cells of the proxy's source show the proxy's data, with tab stops; anything else is
    // painted and sized like QItemDelegate.
    void proxyPainting_data()
    {
        QTest::addColumn<bool>("tabstops");
        QTest::addColumn<QString>("situation");
        for (bool tabstops : {false, true}) {
            for (const char* situation : {"live", "none", "destroyed", "other"})
                QTest::addRow("%s%s", tabstops ? "tab stops, " : "", situation)
                    << tabstops << situation;
        }
    }
    void proxyPainting()
    {
        QFETCH(bool, tabstops);
        QFETCH(QString, situation);
        auto proxy = std::make_unique<Shouting>();
        proxy->setSourceModel(&mModel);
        std::unique_ptr<ZuProxyModelItemDelegate> delegate(tabstops ? new ZuTabstopItemDelegate
                                                                    : new ZuProxyModelItemDelegate);
        if (tabstops)
            static_cast<ZuTabstopItemDelegate*>(delegate.get())
                ->setTabPatternForColumn(0, "WWWWWWWWWWWW\tx");
        if (situation != "none")
            delegate->setProxyModel(proxy.get());
        const QModelIndex index = (situation == "other" ? mOther : mModel).index(0, 0);
        const bool proxied = situation == "live";
        const QModelIndex expected = proxied ? proxy->mapFromSource(index) : index;
        if (situation == "destroyed")
            proxy.reset();
        const QItemDelegate plain;
        const bool same = !proxied || !tabstops;
        QCOMPARE(paintCell(*delegate, index) == paintCell(plain, expected), same);
        QCOMPARE(delegate->sizeHint(cellOption(), index) == plain.sizeHint(cellOption(), expected),
                 same);
    }

    // Stops after each sample and three blanks, in the cell's font or the measuring font;
    // fields of every row start there, and the cell is sized for them.
    void tabStops_data()
    {
        QTest::addColumn<QString>("pattern");
        QTest::addColumn<int>("measuringPixels"); // 0: the cell's font
        QTest::addColumn<QString>("text");
        QTest::addColumn<QStringList>("before"); // samples before the inked field
        QTest::newRow("second stop")
            << "ab\tWWWWWWWW\tx" << 0 << "\t\tH" << QStringList{"ab", "WWWWWWWW"};
        QTest::newRow("empty sample")
            << "\tWWWWWWWW" << 0 << "\t\tH" << QStringList{"", "WWWWWWWW"};
        QTest::newRow("measuring font")
            << "WWWWWWWWWW\tx" << 20 << "\tH" << QStringList{"WWWWWWWWWW"};
    }
    void tabStops()
    {
        QFETCH(QString, pattern);
        QFETCH(int, measuringPixels);
        QFETCH(QString, text);
        QFETCH(QStringList, before);
        const QModelIndex cell = mModel.index(0, 1), neighbour = mModel.index(0, 2);
        mModel.setData(cell, text);
        mModel.setData(neighbour, text);
        ZuTabstopItemDelegate delegate;
        delegate.createIdentityProxyModel(&mModel);
        delegate.setTabPatternForColumn(1, pattern);
        delegate.setTabPatternForColumn(2, pattern);
        const QFont measuring = cellFont(qMax(1, measuringPixels));
        if (measuringPixels)
            delegate.setFontForTabSize(&measuring);
        const QFontMetrics metrics(measuringPixels ? measuring : cellFont());
        int stop = QApplication::style()->pixelMetric(QStyle::PM_FocusFrameHMargin) + 1;
        for (const QString& sample : before)
            stop += metrics.horizontalAdvance(sample + "   ");
        const int ink = inkOf(paintCell(delegate, cell)).x();
        QVERIFY2(ink >= stop && ink <= stop + 2, qPrintable(QString::number(ink)));
        QCOMPARE(inkOf(paintCell(delegate, neighbour)).x(), ink);
        // Wide enough for the tabbed text (nothing elided), with QItemDelegate's padding only.
        const int width = delegate.sizeHint(cellOption(), cell).width();
        const int needed = stop + QFontMetrics(cellFont()).horizontalAdvance("H");
        QVERIFY2(width > needed && width <= needed + 12, qPrintable(QString::number(width)));
        QCOMPARE(paintCell(delegate, cell, cellOption(width)),
                 paintCell(delegate, cell).copy(0, 0, width, 24));

        // Without its pattern a column is plain again, and keeps no stops from other cells.
        delegate.setTabPatternForColumn(1, QString());
        QCOMPARE(paintCell(delegate, cell), paintCell(QItemDelegate(), cell));
        QCOMPARE(inkOf(paintCell(delegate, neighbour)).x(), ink);
        delegate.setFontForTabSize(nullptr); // back to the cell's font
        QCOMPARE(inkOf(paintCell(delegate, neighbour)).x() < ink, measuringPixels > 0);
    }

    // A cell that overflows is clipped to its text with clipping and without, and leaves the
    // painter as it found it.
    void overflow()
    {
        const QModelIndex cell = mModel.index(0, 1);
        mModel.setData(cell, "a\tH\nb\tH");
        ZuTabstopItemDelegate delegate;
        delegate.createIdentityProxyModel(&mModel);
        delegate.setTabPatternForColumn(1, "WWWW\tx");

        static QStringList sWarnings;
        const QtMessageHandler previous =
            qInstallMessageHandler([](QtMsgType, const QMessageLogContext&, const QString& inText) {
                sWarnings << inText;
            });
        const QRect clipped = inkOf(paintCell(delegate, cell));
        delegate.setClipping(false);
        const QRect overflowing = inkOf(paintCell(delegate, cell));
        qInstallMessageHandler(previous);
        QCOMPARE(sWarnings, QStringList()); // saves and restores of the painter balance
        QCOMPARE(overflowing, clipped);
        QVERIFY(overflowing.top() == 0 && overflowing.bottom() == 23);
    }
};

QTEST_MAIN(TstItemDelegates)
#include "tst_itemdelegates.moc"
