#pragma once

#include "zubase/ZuProxyModelItemDelegate.h"

#include <memory>

class QFont;

// Lines up tab-separated text within a column: a column's tab pattern (sample texts separated
// by tabs) gives its tab stops, each after one sample and three blanks, measured in the cell's
// font or in the font set with setFontForTabSize(). Tab stops apply to cells painted through
// the proxy model; other cells are painted like QItemDelegate.
class ZUBASE_EXPORT ZuTabstopItemDelegate : public ZuProxyModelItemDelegate
{
public:
    explicit ZuTabstopItemDelegate(QObject* inParent = nullptr);
    ~ZuTabstopItemDelegate() override;

    QSize sizeHint(const QStyleOptionViewItem& inOption, const QModelIndex& inIndex) const override;
    void setProxyModel(QAbstractProxyModel* inProxy) override;

    // An empty pattern removes the column's tab stops.
    void setTabPatternForColumn(int inColumn, const QString& inPattern);
    // The column's pattern, or an empty string.
    QString tabPatternForColumn(int inColumn) const;
    // Patterns are measured in a copy of *inFont; null: in each cell's own font.
    void setFontForTabSize(const QFont* inFont);

protected:
    void paintProxiedModel(QPainter* inPainter, const QStyleOptionViewItem& inOption,
                           const QModelIndex& inProxyIndex) const override;
    // QItemDelegate keeps its text layout to itself; this draws the text as it does, with the
    // tab stops of the cell being painted.
    void drawDisplay(QPainter* inPainter, const QStyleOptionViewItem& inOption, const QRect& inRect,
                     const QString& inText) const override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
