#include "zubase/ZuProgressIcon.h"

#include <QAccessible>
#include <QAccessibleObject>
#include <QGuiApplication>
#include <QImage>
#include <QPainter>
#include <QPen>
#include <QScreen>
#include <QTimer>

#include <cmath>

namespace {

constexpr int kFrameCount = 8;
constexpr int kFrameSize = 24;

// The highest ratio of all screens, so that the frames are sharp wherever they are shown.
qreal screenRatio()
{
    qreal ratio = 1;
    for (const QScreen* screen : QGuiApplication::screens())
        ratio = qMax(ratio, screen->devicePixelRatio());
    return ratio;
}

QColor dotColor(int inDot, int inFrame)
{
    const int behind = (inFrame - inDot + kFrameCount) % kFrameCount;
    static const int kGreys[] = {60, 80, 100, 120};
    return behind < 4 ? QColor(kGreys[behind], kGreys[behind], kGreys[behind])
                      : QColor(200, 200, 200);
}

QPixmap drawFrame(int inFrame, qreal inRatio)
{
    QImage image(QSize(kFrameSize, kFrameSize) * inRatio, QImage::Format_ARGB32);
    image.setDevicePixelRatio(inRatio);
    image.fill(0);
    QPainter painter(&image);
    painter.setRenderHint(QPainter::Antialiasing);
    for (int dot = 0; dot < kFrameCount; ++dot) {
        const float angle = float(dot) * 3.14159f / 4.0f;
        painter.setPen(
            QPen(dotColor(dot, inFrame), 3.0, Qt::SolidLine, Qt::RoundCap, Qt::BevelJoin));
        painter.drawPoint(QPointF(12 + 8 * std::cos(angle), 12 + 8 * std::sin(angle)));
    }
    painter.end();
    return QPixmap::fromImage(image);
}

} // namespace

class ZuProgressIcon::Private
{
public:
    // Role Animation, busy while the timer runs.
    class Accessible : public QAccessibleObject
    {
    public:
        explicit Accessible(ZuProgressIcon* inIcon) : QAccessibleObject(inIcon) {}
        QAccessibleInterface* parent() const override { return nullptr; }
        int childCount() const override { return 0; }
        QAccessibleInterface* child(int) const override { return nullptr; }
        int indexOfChild(const QAccessibleInterface*) const override { return -1; }
        QAccessible::Role role() const override { return QAccessible::Animation; }
        QString text(QAccessible::Text inText) const override
        {
            if (inText == QAccessible::Name)
                return ZuProgressIcon::tr("Progress");
            if (inText == QAccessible::Description && running())
                return ZuProgressIcon::tr("Busy");
            return QString();
        }
        QAccessible::State state() const override
        {
            QAccessible::State state;
            state.busy = state.animated = running();
            return state;
        }

    private:
        bool running() const
        {
            const auto* icon = static_cast<const ZuProgressIcon*>(object());
            return icon && icon->d->timer.isActive();
        }
    };

    static QAccessibleInterface* accessibleFactory(const QString& inClassName, QObject* inObject)
    {
        if (inClassName == QLatin1String("ZuProgressIcon") && inObject)
            return new Accessible(static_cast<ZuProgressIcon*>(inObject));
        return nullptr;
    }

    void announceBusy(ZuProgressIcon* inIcon)
    {
        QAccessible::State changed;
        changed.busy = changed.animated = true;
        QAccessibleStateChangeEvent event(inIcon, changed);
        QAccessible::updateAccessibility(&event);
    }

    QList<QPixmap> frames;
    int current = 0;
    QTimer timer;
    qreal framesRatio = 0;
};

ZuProgressIcon::ZuProgressIcon() : QObject(nullptr), d(new Private)
{
    static const bool factoryInstalled = [] {
        QAccessible::installFactory(&Private::accessibleFactory);
        return true;
    }();
    Q_UNUSED(factoryInstalled);
    d->timer.setInterval(100);
    connect(&d->timer, SIGNAL(timeout()), this, SLOT(slotAnimatedIconFrameChanged()));
}

ZuProgressIcon::~ZuProgressIcon() = default;

void ZuProgressIcon::start()
{
    if (d->timer.isActive())
        return;
    d->timer.start();
    d->announceBusy(this);
}

void ZuProgressIcon::stop()
{
    if (!d->timer.isActive())
        return;
    d->timer.stop();
    d->announceBusy(this);
}

void ZuProgressIcon::slotAnimatedIconFrameChanged()
{
    // Drawn once; again only when the screens' pixel ratio has changed.
    const qreal ratio = screenRatio();
    if (d->frames.isEmpty() || ratio != d->framesRatio) {
        d->frames.clear();
        for (int frame = 0; frame < kFrameCount; ++frame)
            d->frames << drawFrame(frame, ratio);
        d->framesRatio = ratio;
    }
    d->current = (d->current + 1) % d->frames.size();
    Q_EMIT nextPixmap(d->frames.at(d->current));
}
