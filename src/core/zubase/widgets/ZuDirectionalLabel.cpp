#include "zubase/ZuDirectionalLabel.h"

#include <QPainter>
#include <QTransform>

namespace {

bool isVertical(ZuDirectionalLabel::Direction inDirection)
{
    return inDirection == ZuDirectionalLabel::TopToBottom ||
           inDirection == ZuDirectionalLabel::BottomToTop;
}

QSize turned(const QSize& inSize, ZuDirectionalLabel::Direction inDirection)
{
    return isVertical(inDirection) ? inSize.transposed() : inSize;
}

} // namespace

class ZuDirectionalLabel::Private
{
public:
    Direction direction = Normal;
    QImage image; // the turned rendering; null until painted in a turned direction
    // What the image was made for: any difference means it is stale.
    int imageDirection = Normal;
    QString imageText;
    QFont imageFont;
    QSize imageSize;
    QPalette imagePalette;
    qreal imageRatio = 0;
    Qt::Alignment imageAlignment;
    int imageMargin = 0;
};

ZuDirectionalLabel::ZuDirectionalLabel(QWidget* inParent) : QLabel(inParent), d(new Private) {}

ZuDirectionalLabel::~ZuDirectionalLabel() = default;

ZuDirectionalLabel::Direction ZuDirectionalLabel::direction() const
{
    return d->direction;
}

void ZuDirectionalLabel::setDirection(Direction inDirection)
{
    d->direction = inDirection;
}

QSize ZuDirectionalLabel::sizeHint() const
{
    return turned(QLabel::sizeHint(), d->direction);
}

QSize ZuDirectionalLabel::minimumSizeHint() const
{
    return turned(QLabel::minimumSizeHint(), d->direction);
}

void ZuDirectionalLabel::paintEvent(QPaintEvent* inEvent)
{
    if (d->direction == Normal) {
        QLabel::paintEvent(inEvent);
        return;
    }
    const qreal ratio = devicePixelRatioF();
    const QSize size = turned(this->size(), d->direction);
    if (d->image.isNull() || d->imageDirection != d->direction || d->imageText != text() ||
        d->imageFont != font() || d->imageSize != size || d->imagePalette != palette() ||
        d->imageRatio != ratio || d->imageAlignment != alignment() || d->imageMargin != margin()) {
        QImage image(size * ratio, QImage::Format_ARGB32_Premultiplied);
        image.setDevicePixelRatio(ratio);
        image.fill(0);
        {
            // A child label draws with the font and palette it inherits from this one.
            QLabel label(text(), this);
            label.setGeometry(QRect(QPoint(0, 0), size));
            label.setMargin(margin());
            label.setAlignment(alignment());
            label.render(&image, QPoint(), QRegion(), QWidget::DrawChildren);
        }
        d->imageDirection = d->direction;
        d->imageText = text();
        d->imageFont = font();
        d->imageSize = size;
        d->imagePalette = palette();
        d->imageRatio = ratio;
        d->imageAlignment = alignment();
        d->imageMargin = margin();
        const qreal angle = d->direction == UpsideDown    ? 180
                            : d->direction == TopToBottom ? 90
                                                          : -90;
        d->image = image.transformed(QTransform().rotate(angle),
                                     Qt::FastTransformation); // keeps the ratio
    }
    QPainter painter(this);
    painter.drawImage(QPoint(0, 0), d->image);
}
