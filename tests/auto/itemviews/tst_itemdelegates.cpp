// ZuProxyModelItemDelegate and ZuTabstopItemDelegate: cells painted into images.
#include "zubase/ZuProxyModelItemDelegate.h"
#include "zubase/ZuTabstopItemDelegate.h"

#include <QIdentityProxyModel>
#include <QPainter>
#include <QStandardItemModel>
#include <QtTest>

namespace {

// Shows every text of its source in capitals with a suffix, so proxied cells look different.
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
    QFont font(QStringLiteral("DejaVu Sans"));
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
                 int inWidth = 400)
{
    QImage image(inWidth, 24, QImage::Format_RGB32);
    image.fill(Qt::white);
    QPainter painter(&image);
    inDelegate.paint(&painter, cellOption(inWidth), inIndex);
    return image;
}

// First column at or after inFrom with ink (-1: none).
int inkFrom(const QImage& inImage, int inFrom)
{
    for (int x = inFrom; x < inImage.width(); ++x)
        for (int y = 0; y < inImage.height(); ++y)
            if (qGray(inImage.pixel(x, y)) < 128)
                return x;
    return -1;
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
        mModel.setData(mModel.index(0, 0), "abc");
        mOther.setData(mOther.index(0, 0), "xyz");
    }

    // Cells of the proxy's source show the proxy's data; everything else is QItemDelegate.
    void proxyPainting_data()
    {
        QTest::addColumn<QString>("situation");
        QTest::addColumn<bool>("proxied");
        QTest::newRow("live proxy") << "live" << true;
        QTest::newRow("no proxy") << "none" << false;
        QTest::newRow("proxy destroyed") << "destroyed" << false;
        QTest::newRow("index of another model") << "other" << false;
    }
    void proxyPainting()
    {
        QFETCH(QString, situation);
        QFETCH(bool, proxied);
        auto* proxy = new Shouting;
        proxy->setSourceModel(&mModel);
        ZuProxyModelItemDelegate delegate;
        if (situation != "none")
            delegate.setProxyModel(proxy);
        if (situation == "destroyed")
            delete proxy;
        const QModelIndex index = (situation == "other" ? mOther : mModel).index(0, 0);
        const QModelIndex expected = proxied ? proxy->mapFromSource(index) : index;
        const QItemDelegate plain;
        QCOMPARE(paintCell(delegate, index), paintCell(plain, expected));
        QCOMPARE(delegate.sizeHint(cellOption(), index), plain.sizeHint(cellOption(), expected));
        if (situation != "destroyed")
            delete proxy;
    }

    // Stops after each sample and three blanks, in the cell's font or the measuring font;
    // fields of every row start there.
    void tabStops_data()
    {
        QTest::addColumn<QString>("pattern");
        QTest::addColumn<QString>("text");
        QTest::addColumn<int>("measuringPixels"); // 0: the cell's font
        QTest::addColumn<QStringList>("before");  // samples before the inked field
        QTest::newRow("first stop") << "WWWWWWWWWW\tx"
                                    << "\tH" << 0 << QStringList{"WWWWWWWWWW"};
        QTest::newRow("second stop") << "ab\tWWWWWWWW\tx"
                                     << "\t\tH" << 0 << QStringList{"ab", "WWWWWWWW"};
        QTest::newRow("empty sample") << "\tWWWWWWWW"
                                      << "\t\tH" << 0 << QStringList{"", "WWWWWWWW"};
        QTest::newRow("measuring font") << "WWWWWWWWWW\tx"
                                        << "\tH" << 20 << QStringList{"WWWWWWWWWW"};
    }
    void tabStops()
    {
        QFETCH(QString, pattern);
        QFETCH(QString, text);
        QFETCH(int, measuringPixels);
        QFETCH(QStringList, before);
        mModel.setData(mModel.index(0, 1), text);
        mModel.setData(mModel.index(0, 2), text);
        ZuTabstopItemDelegate delegate;
        delegate.createIdentityProxyModel(&mModel);
        delegate.setTabPatternForColumn(1, pattern);
        delegate.setTabPatternForColumn(2, pattern);
        const QFont measuring = cellFont(qMax(1, measuringPixels));
        if (measuringPixels)
            delegate.setFontForTabSize(&measuring);
        const QFontMetrics metrics(measuringPixels ? measuring : cellFont());
        int stop = 0;
        for (const QString& sample : before)
            stop += metrics.horizontalAdvance(sample + "   ");
        const int margin = QApplication::style()->pixelMetric(QStyle::PM_FocusFrameHMargin) + 1;
        const int ink = inkFrom(paintCell(delegate, mModel.index(0, 1)), 0);
        QVERIFY2(ink >= margin + stop && ink <= margin + stop + 2,
                 qPrintable(QString::number(ink)));
        QCOMPARE(inkFrom(paintCell(delegate, mModel.index(0, 2)), 0), ink);
        // Wide enough for the tabbed text (nothing elided), with QItemDelegate's padding only.
        const int width = delegate.sizeHint(cellOption(), mModel.index(0, 1)).width();
        const int needed = margin + stop + QFontMetrics(cellFont()).horizontalAdvance("H");
        QVERIFY2(width > needed && width <= needed + 12, qPrintable(QString::number(width)));
        QCOMPARE(paintCell(delegate, mModel.index(0, 1), width),
                 paintCell(delegate, mModel.index(0, 1)).copy(0, 0, width, 24));
        // Without its pattern a column is plain again, and keeps no stops from other cells.
        delegate.setTabPatternForColumn(1, QString());
        QCOMPARE(delegate.tabPatternForColumn(1), QString());
        QCOMPARE(delegate.tabPatternForColumn(2), pattern);
        const QItemDelegate plain;
        QCOMPARE(paintCell(delegate, mModel.index(0, 1)), paintCell(plain, mModel.index(0, 1)));
        QCOMPARE(delegate.sizeHint(cellOption(), mModel.index(0, 1)),
                 plain.sizeHint(cellOption(), mModel.index(0, 1)));
        QCOMPARE(inkFrom(paintCell(delegate, mModel.index(0, 2)), 0), ink);
        // Back to the cell's font.
        delegate.setFontForTabSize(nullptr);
        if (measuringPixels)
            QVERIFY(inkFrom(paintCell(delegate, mModel.index(0, 2)), 0) < ink);
    }

    // Tab stops are a matter of the proxied cells only.
    void noStopsWithoutProxy()
    {
        mModel.setData(mModel.index(0, 1), "\tH");
        ZuTabstopItemDelegate delegate;
        delegate.setTabPatternForColumn(1, "WWWWWWWWWWWWWWWW\tx");
        const QItemDelegate plain;
        QCOMPARE(paintCell(delegate, mModel.index(0, 1)), paintCell(plain, mModel.index(0, 1)));
        QCOMPARE(delegate.sizeHint(cellOption(), mModel.index(0, 1)),
                 plain.sizeHint(cellOption(), mModel.index(0, 1)));
    }
};

QTEST_MAIN(TstItemDelegates)
#include "tst_itemdelegates.moc"
