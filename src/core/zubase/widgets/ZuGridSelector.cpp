#include "zubase/widgets/ZuGridSelector_p.h"

#include <QKeyEvent>
#include <QPainter>

namespace {

const int kColumns = 10;
const int kRows = 5;
const int kPitch = 34;
const int kCellSize = 30;

} // namespace

// Keys reach the grid through a filter, so that the widget keeps the handlers it always had.
class ZuGridSelector::KeyHandler : public QObject
{
public:
    explicit KeyHandler(ZuGridSelector* inGrid) : QObject(inGrid), mGrid(inGrid) {}

    bool eventFilter(QObject* inWatched, QEvent* inEvent) override
    {
        if (inWatched != mGrid)
            return false;
        const QEvent::Type type = inEvent->type();
        if (type != QEvent::KeyPress && type != QEvent::ShortcutOverride)
            return false;
        auto* keyEvent = static_cast<QKeyEvent*>(inEvent);
        const int key = keyEvent->key();
        switch (key) {
        case Qt::Key_Left:
        case Qt::Key_Right:
        case Qt::Key_Up:
        case Qt::Key_Down:
        case Qt::Key_Return:
        case Qt::Key_Enter:
            break;
        default:
            return false; // Escape closes the menu around the grid
        }
        keyEvent->accept();
        if (type == QEvent::KeyPress) {
            if (key == Qt::Key_Return || key == Qt::Key_Enter)
                Q_EMIT mGrid->cellSelected(mGrid->mSelectedColumn, mGrid->mSelectedRow);
            else if (mGrid->moveByKey(key))
                mGrid->selectionChanged();
        }
        return true;
    }

private:
    ZuGridSelector* mGrid;
};

ZuGridSelector::ZuGridSelector(QWidget* inParent, int inStep)
    : QWidget(inParent), mStep(qMax(inStep, 1))
{
    mSelectedColumn = mStep - 1;
    mSelectedRow = 0;
    setAttribute(Qt::WA_MouseTracking);
    mHeaderHeight = QFontMetrics(font()).height() + 16;
    setFixedSize(kColumns * kPitch, mHeaderHeight + kRows * kPitch);

    setFocusPolicy(Qt::StrongFocus);
    installEventFilter(new KeyHandler(this));
    setAccessibleName(tr("New Layout"));
    setAccessibleDescription(caption());
}

QString ZuGridSelector::caption() const
{
    return tr("New Layout") +
           QStringLiteral(" %1x%2").arg(mSelectedColumn + 1).arg(mSelectedRow + 1);
}

void ZuGridSelector::selectionChanged()
{
    const QString text = caption();
    if (accessibleDescription() != text)
        setAccessibleDescription(text);
    update();
}

bool ZuGridSelector::moveByKey(int inKey)
{
    // Unlike the pointer, the keys stay on the grid that is drawn.
    const int lastColumn = kColumns / mStep * mStep - 1;
    switch (inKey) {
    case Qt::Key_Right:
        if (mSelectedColumn + mStep > lastColumn)
            return false;
        mSelectedColumn += mStep;
        return true;
    case Qt::Key_Left:
        if (mSelectedColumn - mStep < 0)
            return false;
        mSelectedColumn -= mStep;
        return true;
    case Qt::Key_Down:
        if (mSelectedRow + 1 >= kRows)
            return false;
        ++mSelectedRow;
        return true;
    case Qt::Key_Up:
        if (mSelectedRow <= 0)
            return false;
        --mSelectedRow;
        return true;
    default:
        return false;
    }
}

void ZuGridSelector::mousePressEvent(QMouseEvent*)
{
    Q_EMIT cellSelected(mSelectedColumn, mSelectedRow);
}

void ZuGridSelector::mouseMoveEvent(QMouseEvent* inEvent)
{
    const int column = inEvent->pos().x() / kPitch;
    if ((column + 1) % mStep == 0)
        mSelectedColumn = column;
    // Far left of the grid (the pointer grabbed) the narrowest allowed selection, not 1 column.
    if (mSelectedColumn < 0)
        mSelectedColumn = mStep - 1;
    mSelectedRow = qMax((inEvent->pos().y() - mHeaderHeight) / kPitch, 0);
    selectionChanged();
    QWidget::mouseMoveEvent(inEvent);
}

void ZuGridSelector::paintEvent(QPaintEvent*)
{
    // The painter starts with the palette's text colour, so both marks and caption follow the
    // colour scheme.
    QPainter painter(this);
    painter.drawText(QPoint(0, mHeaderHeight - 4), caption());
    const QColor highlight = palette().color(QPalette::Highlight);
    for (int column = 0; column < kColumns; ++column) {
        for (int row = 0; row < kRows; ++row) {
            const QRect cell(2 + kPitch * column, mHeaderHeight + 2 + kPitch * row, kCellSize,
                             kCellSize);
            painter.drawLine(cell.topLeft(), cell.topRight());
            painter.drawLine(cell.topRight(), cell.bottomRight());
            painter.drawLine(cell.bottomRight(), cell.bottomLeft());
            painter.drawLine(cell.bottomLeft(), cell.topLeft());
            if (column <= mSelectedColumn && row <= mSelectedRow)
                painter.fillRect(cell, highlight);
        }
    }
}
