#pragma once

#include "zubase/zubase_export.h"

#include <QLayout>
#include <QStyle>

#include <memory>

// Places its items left to right in rows and starts a new row where the next item would pass
// the right edge, like words in a paragraph. Its height depends on the width it gets.
class ZUBASE_EXPORT ZuFlowLayout : public QLayout
{
public:
    // Installed on inParent. A margin of -1 takes the margins from the style; a spacing of -1
    // derives it from the parent's style (see horizontalSpacing()).
    ZuFlowLayout(QWidget* inParent, int inMargin, int inHorizontalSpacing, int inVerticalSpacing);
    // Without a parent widget, to be nested or installed later.
    explicit ZuFlowLayout(int inMargin = -1, int inHorizontalSpacing = -1,
                          int inVerticalSpacing = -1);
    // Deletes the items; the widgets they manage stay alive.
    ~ZuFlowLayout() override;

    void addItem(QLayoutItem* inItem) override;
    // Null for an index out of range.
    QLayoutItem* itemAt(int inIndex) const override;
    // Removes and returns the item; null for an index out of range.
    QLayoutItem* takeAt(int inIndex) override;
    int count() const override;

    // The spacing given to the constructor when it is 0 or more; else the parent widget's style
    // metric, the parent layout's spacing, or -1 without a parent, in which case every item
    // asks its own widget's style.
    int horizontalSpacing() const;
    int verticalSpacing() const;

    // The layout never asks for more room than its size hint.
    Qt::Orientations expandingDirections() const override;
    bool hasHeightForWidth() const override;
    // The height the items take at that width, margins included. The items are measured once
    // per invalidation and the last answer is kept for the same width; invalidate(), addItem()
    // and takeAt() forget both.
    int heightForWidth(int inWidth) const override;
    // The largest item's minimum size plus the margins (not a row).
    QSize minimumSize() const override;
    QSize sizeHint() const override;
    void setGeometry(const QRect& inRect) override;
    // Forgets the measured items and the cached height along with QLayout's own caches.
    void invalidate() override;

private:
    // Lays the items out in inRect (only measures when inTrialOnly); returns the height used.
    int doLayout(const QRect& inRect, bool inTrialOnly) const;
    int smartSpacing(QStyle::PixelMetric inMetric) const;

    class Private;
    std::unique_ptr<Private> const d;
};
