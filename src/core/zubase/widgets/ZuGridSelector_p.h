#pragma once

#include <QWidget>

// The grid of ZuNewLayoutAction: a caption "New Layout CxR" above 10 x 5 cells; the pointer
// selects the cells from the top-left corner to the one under it, a click reports them. The
// arrow keys move the selection, Enter picks it, Escape is left to the menu.
class ZuGridSelector : public QWidget
{
    Q_OBJECT
public:
    // Column counts are kept to multiples of inStep (below 1 means 1).
    ZuGridSelector(QWidget* inParent, int inStep);

Q_SIGNALS:
    // Zero-based indices of the rightmost selected column and the lowest selected row.
    void cellSelected(int, int);

protected:
    void mousePressEvent(QMouseEvent* inEvent) override;
    void mouseMoveEvent(QMouseEvent* inEvent) override;
    void paintEvent(QPaintEvent* inEvent) override;

private:
    class KeyHandler;
    QString caption() const;
    // Repaints and tells a screen reader the new caption.
    void selectionChanged();
    bool moveByKey(int inKey);

    int mSelectedColumn;
    int mSelectedRow;
    int mHeaderHeight;
    int mStep;
};
