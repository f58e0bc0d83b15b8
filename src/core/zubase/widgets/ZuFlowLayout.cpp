#include "zubase/ZuFlowLayout.h"

#include <QApplication>
#include <QList>
#include <QVector>
#include <QWidget>

class ZuFlowLayout::Private
{
public:
    Private(int inHorizontalSpacing, int inVerticalSpacing)
        : horizontalSpacing(inHorizontalSpacing), verticalSpacing(inVerticalSpacing)
    {}

    // What one item needs: its size hint and the room before its neighbours.
    struct Measure
    {
        QSize hint;
        int spaceX;
        int spaceY;
    };

    void forget()
    {
        measured = false;
        cachedWidth = -1;
    }

    QList<QLayoutItem*> items; // owned
    int horizontalSpacing;
    int verticalSpacing;
    // The items are measured once per invalidation, as QWidgetItemV2 does, so that the passes
    // at other widths run over this array instead of every widget's own data.
    QVector<Measure> measures;
    bool measured = false;
    // Widgets ask again and again for the height at the width they already have.
    int cachedWidth = -1;
    int cachedHeight = 0;
};

ZuFlowLayout::ZuFlowLayout(QWidget* inParent, int inMargin, int inHorizontalSpacing,
                           int inVerticalSpacing)
    : QLayout(inParent), d(new Private(inHorizontalSpacing, inVerticalSpacing))
{
    setContentsMargins(inMargin, inMargin, inMargin, inMargin);
}

ZuFlowLayout::ZuFlowLayout(int inMargin, int inHorizontalSpacing, int inVerticalSpacing)
    : d(new Private(inHorizontalSpacing, inVerticalSpacing))
{
    setContentsMargins(inMargin, inMargin, inMargin, inMargin);
}

ZuFlowLayout::~ZuFlowLayout()
{
    while (QLayoutItem* item = takeAt(0))
        delete item;
}

void ZuFlowLayout::addItem(QLayoutItem* inItem)
{
    d->items.append(inItem);
    d->forget();
}

QLayoutItem* ZuFlowLayout::itemAt(int inIndex) const
{
    return d->items.value(inIndex);
}

QLayoutItem* ZuFlowLayout::takeAt(int inIndex)
{
    if (inIndex < 0 || inIndex >= d->items.size())
        return nullptr;
    d->forget();
    return d->items.takeAt(inIndex);
}

int ZuFlowLayout::count() const
{
    return d->items.size();
}

int ZuFlowLayout::horizontalSpacing() const
{
    if (d->horizontalSpacing >= 0)
        return d->horizontalSpacing;
    return smartSpacing(QStyle::PM_LayoutHorizontalSpacing);
}

int ZuFlowLayout::verticalSpacing() const
{
    if (d->verticalSpacing >= 0)
        return d->verticalSpacing;
    return smartSpacing(QStyle::PM_LayoutVerticalSpacing);
}

Qt::Orientations ZuFlowLayout::expandingDirections() const
{
    return Qt::Orientations();
}

bool ZuFlowLayout::hasHeightForWidth() const
{
    return true;
}

int ZuFlowLayout::heightForWidth(int inWidth) const
{
    if (d->cachedWidth == inWidth)
        return d->cachedHeight;
    const int height = doLayout(QRect(0, 0, inWidth, 0), true);
    d->cachedWidth = inWidth;
    d->cachedHeight = height;
    return height;
}

QSize ZuFlowLayout::minimumSize() const
{
    QSize size;
    for (const QLayoutItem* item : qAsConst(d->items))
        size = size.expandedTo(item->minimumSize());
    // margin() is -1 as soon as the four margins differ; the margins in force always add up.
    const QMargins margins = contentsMargins();
    size += QSize(margins.left() + margins.right(), margins.top() + margins.bottom());
    return size;
}

QSize ZuFlowLayout::sizeHint() const
{
    return minimumSize();
}

void ZuFlowLayout::setGeometry(const QRect& inRect)
{
    QLayout::setGeometry(inRect);
    doLayout(inRect, false);
}

void ZuFlowLayout::invalidate()
{
    d->forget();
    QLayout::invalidate();
}

int ZuFlowLayout::doLayout(const QRect& inRect, bool inTrialOnly) const
{
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;
    getContentsMargins(&left, &top, &right, &bottom);
    const QRect effectiveRect = inRect.adjusted(left, top, -right, -bottom);
    int x = effectiveRect.x();
    int y = effectiveRect.y();
    int lineHeight = 0;

    if (!d->measured) {
        const int horizontal = horizontalSpacing();
        const int vertical = verticalSpacing();
        // Spacers and nested layouts have no widget to ask for the style's spacing.
        const QWidget* parent = parentWidget();
        const QStyle* fallbackStyle = parent ? parent->style() : QApplication::style();
        d->measures.resize(d->items.size());
        for (int i = 0; i < d->items.size(); ++i) {
            QLayoutItem* item = d->items.at(i);
            Private::Measure& measure = d->measures[i];
            measure.hint = item->sizeHint();
            measure.spaceX = horizontal;
            measure.spaceY = vertical;
            if (horizontal != -1 && vertical != -1)
                continue;
            const QWidget* widget = item->widget();
            const QStyle* style = widget ? widget->style() : fallbackStyle;
            if (horizontal == -1)
                measure.spaceX = style->layoutSpacing(QSizePolicy::PushButton,
                                                      QSizePolicy::PushButton, Qt::Horizontal);
            if (vertical == -1)
                measure.spaceY = style->layoutSpacing(QSizePolicy::PushButton,
                                                      QSizePolicy::PushButton, Qt::Vertical);
        }
        d->measured = true;
    }

    for (int i = 0; i < d->measures.size(); ++i) {
        const Private::Measure& measure = d->measures.at(i);
        int nextX = x + measure.hint.width() + measure.spaceX;
        if (nextX - measure.spaceX > effectiveRect.right() && lineHeight > 0) {
            x = effectiveRect.x();
            y = y + lineHeight + measure.spaceY;
            nextX = x + measure.hint.width() + measure.spaceX;
            lineHeight = 0;
        }
        if (!inTrialOnly)
            d->items.at(i)->setGeometry(QRect(QPoint(x, y), measure.hint));
        x = nextX;
        lineHeight = qMax(lineHeight, measure.hint.height());
    }
    return y + lineHeight - inRect.y() + bottom;
}

int ZuFlowLayout::smartSpacing(QStyle::PixelMetric inMetric) const
{
    QObject* parentObject = parent();
    if (!parentObject)
        return -1;
    if (parentObject->isWidgetType()) {
        auto* widget = static_cast<QWidget*>(parentObject);
        return widget->style()->pixelMetric(inMetric, nullptr, widget);
    }
    // Nested in another layout; any other parent object has no spacing to offer.
    const auto* layout = qobject_cast<const QLayout*>(parentObject);
    return layout ? layout->spacing() : -1;
}
