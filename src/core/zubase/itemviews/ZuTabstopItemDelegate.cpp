#include "zubase/ZuTabstopItemDelegate.h"

#include <QAbstractProxyModel>
#include <QApplication>
#include <QFontMetrics>
#include <QPainter>
#include <QPointer>
#include <QStyle>
#include <QTextLayout>
#include <QtMath>

#include <map>

namespace {

using TabStops = QList<QTextOption::Tab>;

const QString kTabGap = QStringLiteral("   ");

// Lays out the text unwrapped unless a width is given; returns the size used.
QSizeF layOut(QTextLayout& ioLayout, qreal inLineWidth)
{
    qreal height = 0;
    qreal widthUsed = 0;
    ioLayout.beginLayout();
    for (QTextLine line = ioLayout.createLine(); line.isValid(); line = ioLayout.createLine()) {
        line.setLineWidth(inLineWidth);
        line.setPosition(QPointF(0, height));
        height += line.height();
        widthUsed = qMax(widthUsed, line.naturalTextWidth());
    }
    ioLayout.endLayout();
    return QSizeF(widthUsed, height);
}

QString withLineSeparators(QString inText)
{
    return inText.replace(QLatin1Char('\n'), QChar::LineSeparator);
}

// Unwrapped width of the text with these tab stops, or with the default tab distance.
qreal textWidth(const QString& inText, const QFont& inFont, const TabStops& inTabs)
{
    QTextOption option;
    option.setWrapMode(QTextOption::ManualWrap);
    option.setTabs(inTabs);
    QTextLayout layout(withLineSeparators(inText), inFont);
    layout.setTextOption(option);
    return layOut(layout, 1e6).width();
}

} // namespace

class ZuTabstopItemDelegate::Private
{
public:
    TabStops tabStops(int inColumn, const QFont& inCellFont) const;

    std::map<int, QString> patterns;
    std::unique_ptr<QFontMetrics> tabMetrics; // null: measured in the cell's font
    QPointer<QAbstractProxyModel> proxy;      // sizing must see the text the base class sizes
    TabStops tabs;                            // in force while one cell is painted or sized

    // Measuring a pattern costs more than painting a short cell; stops are kept per column
    // until its pattern or the measuring font changes.
    struct Measured
    {
        QFont font;
        TabStops tabs;
    };
    mutable std::map<int, Measured> measured;
    mutable QTextLayout layout;
};

TabStops ZuTabstopItemDelegate::Private::tabStops(int inColumn, const QFont& inCellFont) const
{
    const auto pattern = patterns.find(inColumn);
    if (pattern == patterns.end())
        return {};
    const auto known = measured.find(inColumn);
    if (known != measured.end() && (tabMetrics || known->second.font == inCellFont))
        return known->second.tabs;
    const QFontMetrics metrics = tabMetrics ? *tabMetrics : QFontMetrics(inCellFont);
    TabStops stops;
    int position = 0;
    for (const QString& part : pattern->second.split(QLatin1Char('\t'), Qt::KeepEmptyParts)) {
        position += metrics.horizontalAdvance(part + kTabGap);
        stops << QTextOption::Tab(position, QTextOption::LeftTab);
    }
    measured[inColumn] = Measured{inCellFont, stops};
    return stops;
}

ZuTabstopItemDelegate::ZuTabstopItemDelegate(QObject* inParent)
    : ZuProxyModelItemDelegate(inParent), d(new Private)
{}

ZuTabstopItemDelegate::~ZuTabstopItemDelegate() = default;

void ZuTabstopItemDelegate::setProxyModel(QAbstractProxyModel* inProxy)
{
    d->proxy = inProxy;
    ZuProxyModelItemDelegate::setProxyModel(inProxy);
}

void ZuTabstopItemDelegate::setTabPatternForColumn(int inColumn, const QString& inPattern)
{
    d->measured.erase(inColumn);
    if (inPattern.isEmpty())
        d->patterns.erase(inColumn);
    else
        d->patterns[inColumn] = inPattern;
}

QString ZuTabstopItemDelegate::tabPatternForColumn(int inColumn) const
{
    const auto pattern = d->patterns.find(inColumn);
    return pattern == d->patterns.end() ? QString() : pattern->second;
}

void ZuTabstopItemDelegate::setFontForTabSize(const QFont* inFont)
{
    d->measured.clear();
    if (inFont)
        d->tabMetrics = std::make_unique<QFontMetrics>(*inFont);
    else
        d->tabMetrics.reset();
}

void ZuTabstopItemDelegate::paintProxiedModel(QPainter* inPainter,
                                              const QStyleOptionViewItem& inOption,
                                              const QModelIndex& inProxyIndex) const
{
    const TabStops tabs = d->tabStops(inProxyIndex.column(), inOption.font);
    if (tabs.isEmpty()) {
        ZuProxyModelItemDelegate::paintProxiedModel(inPainter, inOption, inProxyIndex);
        return;
    }
    const TabStops saved = d->tabs;
    d->tabs = tabs;
    ZuProxyModelItemDelegate::paintProxiedModel(inPainter, inOption, inProxyIndex);
    d->tabs = saved;
}

QSize ZuTabstopItemDelegate::sizeHint(const QStyleOptionViewItem& inOption,
                                      const QModelIndex& inIndex) const
{
    QSize size = ZuProxyModelItemDelegate::sizeHint(inOption, inIndex);
    // Cells that are not painted through the proxy are not painted with tab stops either.
    if (!d->proxy || !inIndex.model() || inIndex.model() != d->proxy->sourceModel())
        return size;
    const TabStops tabs = d->tabStops(inIndex.column(), inOption.font);
    if (tabs.isEmpty())
        return size;
    // The base class measured the text with its default tab distance; the difference to the
    // width with this column's stops is what the cell needs more (or less).
    const QModelIndex proxyIndex = d->proxy->mapFromSource(inIndex);
    const QVariant value = proxyIndex.data(Qt::DisplayRole);
    if (value.userType() != QMetaType::QString)
        return size;
    const QString text = value.toString();
    if (!text.contains(QLatin1Char('\t')))
        return size;
    QFont font = inOption.font;
    const QVariant fontValue = proxyIndex.data(Qt::FontRole);
    if (fontValue.isValid())
        font = qvariant_cast<QFont>(fontValue).resolve(inOption.font);
    size.rwidth() += qCeil(textWidth(text, font, tabs)) - qCeil(textWidth(text, font, {}));
    return size;
}

void ZuTabstopItemDelegate::drawDisplay(QPainter* inPainter, const QStyleOptionViewItem& inOption,
                                        const QRect& inRect, const QString& inText) const
{
    if (d->tabs.isEmpty()) {
        QItemDelegate::drawDisplay(inPainter, inOption, inRect, inText);
        return;
    }
    QPalette::ColorGroup group =
        inOption.state & QStyle::State_Enabled ? QPalette::Normal : QPalette::Disabled;
    if (group == QPalette::Normal && !(inOption.state & QStyle::State_Active))
        group = QPalette::Inactive;
    if (inOption.state & QStyle::State_Selected) {
        inPainter->fillRect(inRect, inOption.palette.brush(group, QPalette::Highlight));
        inPainter->setPen(inOption.palette.color(group, QPalette::HighlightedText));
    } else {
        inPainter->setPen(inOption.palette.color(group, QPalette::Text));
    }
    if (inText.isEmpty())
        return;
    if (inOption.state & QStyle::State_Editing) {
        inPainter->save();
        inPainter->setPen(inOption.palette.color(group, QPalette::Text));
        inPainter->drawRect(inRect.adjusted(0, 0, -1, -1));
        inPainter->restore();
    }

    const QWidget* widget = inOption.widget;
    const QStyle* style = widget ? widget->style() : QApplication::style();
    const int textMargin = style->pixelMetric(QStyle::PM_FocusFrameHMargin, nullptr, widget) + 1;
    const QRect textRect = inRect.adjusted(textMargin, 0, -textMargin, 0);
    QTextOption option;
    option.setWrapMode(inOption.features & QStyleOptionViewItem::WrapText
                           ? QTextOption::WordWrap
                           : QTextOption::ManualWrap);
    option.setTextDirection(inOption.direction);
    option.setAlignment(QStyle::visualAlignment(inOption.direction, inOption.displayAlignment));
    option.setTabs(d->tabs);
    QTextLayout& layout = d->layout;
    layout.setTextOption(option);
    layout.setFont(inOption.font);
    layout.setText(withLineSeparators(inText));
    QSizeF used = layOut(layout, textRect.width());
    if (used.width() > textRect.width() || used.height() > textRect.height()) {
        QStringList lines;
        for (const QString& line : inText.split(QChar::LineSeparator))
            lines << inOption.fontMetrics.elidedText(line, inOption.textElideMode,
                                                     textRect.width());
        layout.setText(withLineSeparators(lines.join(QChar::LineSeparator)));
        used = layOut(layout, textRect.width());
    }
    const QRect layoutRect =
        QStyle::alignedRect(inOption.direction, inOption.displayAlignment,
                            QSize(textRect.width(), int(used.height())), textRect);
    // Tab stops can push text past the eliding estimate: clip what still overflows.
    const bool overflows = used.width() > textRect.width() || used.height() > textRect.height();
    if (overflows && !hasClipping()) {
        inPainter->save();
        inPainter->setClipRect(layoutRect);
    }
    layout.draw(inPainter, layoutRect.topLeft(), {}, layoutRect);
    if (overflows && !hasClipping())
        inPainter->restore();
}
