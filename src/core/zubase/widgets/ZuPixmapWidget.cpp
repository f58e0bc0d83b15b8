#include "zubase/ZuPixmapWidget.h"

#include <QPainter>

ZuPixmapWidget::ZuPixmapWidget(QWidget* inParent) : QWidget(inParent) {}

ZuPixmapWidget::~ZuPixmapWidget() = default;

void ZuPixmapWidget::setPixmap(QPixmap inPixmap)
{
    if (inPixmap.cacheKey() == mPixmap.cacheKey())
        return;
    mPixmap = std::move(inPixmap);
    update();
}

void ZuPixmapWidget::setOverlayText(const QString& inText, Qt::Alignment inAlignment)
{
    if (inText == mOverlayText && inAlignment == mOverlayAlignment)
        return;
    mOverlayText = inText;
    mOverlayAlignment = inAlignment;
    setAccessibleDescription(inText);
    update();
}

void ZuPixmapWidget::setBackgroundColor(const QColor& inColor)
{
    if (mBackgroundColor == inColor)
        return;
    mBackgroundColor = inColor;
    update();
}

void ZuPixmapWidget::setOverlayTextColor(const QColor& inColor)
{
    if (mOverlayTextColor == inColor)
        return;
    mOverlayTextColor = inColor;
    update();
}

void ZuPixmapWidget::setFrameColor(const QColor& inColor)
{
    if (mFrameColor == inColor)
        return;
    mFrameColor = inColor;
    update();
}

QSize ZuPixmapWidget::sizeHint() const
{
    return mPixmap.size();
}

QRect ZuPixmapWidget::fitIntoRect(const QRect& inRect, const QSize& inSize) const
{
    // 64 bits: a large pixmap in a large widget overflows the products in int.
    const qint64 width = inRect.width();
    const qint64 height = inRect.height();
    if (inSize.isEmpty())
        return QRect(); // a null pixmap: nothing to divide by
    const qint64 sourceWidth = inSize.width();
    const qint64 sourceHeight = inSize.height();
    const qint64 heightForWidth = sourceHeight * width / sourceWidth;
    const qint64 widthForHeight = sourceWidth * height / sourceHeight;
    if (heightForWidth > height)
        return QRect(inRect.left() + int((width - widthForHeight) / 2), inRect.top(),
                     int(widthForHeight), int(height));
    return QRect(inRect.left(), inRect.top() + int((height - heightForWidth) / 2), int(width),
                 int(heightForWidth));
}

void ZuPixmapWidget::paintEvent(QPaintEvent*)
{
    QPainter painter(this);
    painter.setPen(Qt::NoPen);
    painter.setBrush(mBackgroundColor.value_or(palette().color(QPalette::Window)));
    painter.drawRect(rect());

    const QRect target = fitIntoRect(rect(), mPixmap.size());
    if (!target.isEmpty())
        painter.drawPixmap(target, mPixmap);

    if (!mOverlayText.isEmpty()) {
        QFont font = painter.font();
        if (font.pixelSize() > 0)
            font.setPixelSize(qMax(1, int(font.pixelSize() * 1.2)));
        else
            font.setPointSize(qMax(1, int(font.pointSizeF() * 1.2)));
        font.setStyleStrategy(QFont::PreferAntialias);
        painter.setFont(font);
        const QRect textRect = painter.fontMetrics().boundingRect(
            rect().adjusted(0, 0, -1, -1), int(mOverlayAlignment), mOverlayText);
        QColor box(Qt::darkGray);
        box.setAlphaF(0.7);
        painter.setPen(Qt::NoPen);
        painter.setBrush(box);
        painter.drawRect(textRect.adjusted(-2, -2, 1, 1));
        painter.setPen(mOverlayTextColor.value_or(palette().color(QPalette::WindowText)));
        painter.drawText(textRect, int(mOverlayAlignment), mOverlayText);
    }

    // The outermost pixel ring, drawn as fills so that it stays one pixel wide at any ratio.
    const QColor frame = mFrameColor.value_or(palette().color(QPalette::WindowText));
    const QRect area = rect();
    painter.fillRect(QRect(area.left(), area.top(), area.width(), 1), frame);
    painter.fillRect(QRect(area.left(), area.bottom(), area.width(), 1), frame);
    painter.fillRect(QRect(area.left(), area.top(), 1, area.height()), frame);
    painter.fillRect(QRect(area.right(), area.top(), 1, area.height()), frame);
}
