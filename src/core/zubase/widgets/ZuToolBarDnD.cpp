#include "zubase/ZuToolBarDnD.h"

#include <QActionEvent>
#include <QApplication>
#include <QCursor>
#include <QDrag>
#include <QDropEvent>
#include <QImage>
#include <QMimeData>
#include <QMouseEvent>
#include <QPixmap>
#include <QToolButton>

namespace {

// The address of the dragged button's action: meaningful inside this process only.
const QString kMimeType = QStringLiteral("ZuToolBarDnD/drag-button");

} // namespace

class ZuToolBarDnD::Private
{
public:
    explicit Private(ZuToolBarDnD* inOwner) : q(inOwner) {}

    void startDrag(QToolButton* inButton);
    void performDrop(const QByteArray& inPayload);

    ZuToolBarDnD* const q;
    bool dragAndDropEnabled = false;
    QPoint pressPosition; // in the pressed button's coordinates
};

void ZuToolBarDnD::Private::startDrag(QToolButton* inButton)
{
    auto* drag = new QDrag(q); // the tool bar is the source checkDropSupported() looks for
    auto* mimeData = new QMimeData;
    QByteArray payload;
    payload.setNum(qint64(reinterpret_cast<quintptr>(inButton->defaultAction())));
    mimeData->setData(kMimeType, payload);
    drag->setMimeData(mimeData);

    QImage image(inButton->size(), QImage::Format_ARGB32);
    image.fill(0);
    inButton->render(&image, QPoint(), QRegion(), QWidget::DrawChildren);
    drag->setPixmap(QPixmap::fromImage(image));

    // Otherwise the button stays pressed during and after the drag.
    if (inButton->isDown() && !inButton->isChecked())
        inButton->setDown(false);
    drag->exec(Qt::MoveAction);
}

void ZuToolBarDnD::Private::performDrop(const QByteArray& inPayload)
{
    const qint64 address = inPayload.toLongLong(nullptr, 10);
    QList<QAction*> actions = q->actions();
    int source = -1;
    for (int i = 0; i < actions.size(); ++i) {
        if (qint64(reinterpret_cast<quintptr>(actions.at(i))) == address) {
            source = i;
            break;
        }
    }
    if (source < 0)
        return;

    // Where the cursor is, not where the drop event says.
    const QPoint cursor = q->mapFromGlobal(QCursor::pos());
    int destination = actions.size();
    for (int i = actions.size() - 1; i >= 0; --i) {
        const QWidget* widget = q->widgetForAction(actions.at(i));
        if (!widget || !widget->isVisible())
            continue;
        const QRect geometry = widget->geometry();
        const bool before = q->orientation() == Qt::Horizontal
                                ? cursor.x() < int(geometry.x() + geometry.width() * 0.5)
                                : cursor.y() < int(geometry.y() + geometry.height() * 0.5);
        if (before)
            destination = i;
    }
    if (destination == source)
        return;

    QAction* dragged = actions.at(source);
    if (destination < actions.size()) {
        QAction* before = actions.at(destination);
        actions.removeAt(source);
        actions.insert(actions.indexOf(before), dragged);
    } else {
        actions.removeAt(source);
        actions.append(dragged);
    }
    q->removeActions();
    q->addActions(actions);
    Q_EMIT q->toolButtonOrderChanged();
}

ZuToolBarDnD::ZuToolBarDnD(QWidget* inParent) : QToolBar(inParent), d(new Private(this)) {}

ZuToolBarDnD::~ZuToolBarDnD() = default;

void ZuToolBarDnD::setDragAndDropEnabled(bool inEnabled)
{
    d->dragAndDropEnabled = inEnabled;
    setAcceptDrops(inEnabled);
}

bool ZuToolBarDnD::dragAndDropEnabled() const
{
    return d->dragAndDropEnabled;
}

void ZuToolBarDnD::changeActionOrder(const QList<QAction*>& inActions)
{
    if (!compareActionsOrderIndepend(inActions, actions()))
        return;
    removeActions();
    addActions(inActions);
    Q_EMIT toolButtonOrderChanged();
}

void ZuToolBarDnD::removeActions()
{
    const QList<QAction*> all = actions();
    for (int i = all.size() - 1; i >= 0; --i)
        removeAction(all.at(i));
}

bool ZuToolBarDnD::compareActionsOrderIndepend(const QList<QAction*>& inFirst,
                                               const QList<QAction*>& inSecond)
{
    if (inFirst.size() != inSecond.size())
        return false;
    QList<QAction*> first = inFirst;
    QList<QAction*> second = inSecond;
    for (int i = second.size() - 1; i >= 0; --i) {
        const int match = first.lastIndexOf(second.at(i));
        if (match >= 0) {
            first.removeAt(match);
            second.removeAt(i);
        }
    }
    return first.isEmpty() && second.isEmpty();
}

bool ZuToolBarDnD::checkDropSupported(QDropEvent* inEvent, QObject* inTarget)
{
    if (!inEvent)
        return false;
    if (inEvent->mimeData()->data(kMimeType).isEmpty()) {
        inEvent->setDropAction(Qt::IgnoreAction);
        return false;
    }
    QObject* source = inEvent->source();
    const auto* button = qobject_cast<QToolButton*>(inTarget);
    const bool supported = source && (inTarget == source || (button && button->parent() == source));
    if (!supported) {
        inEvent->setDropAction(Qt::IgnoreAction);
        return false;
    }
    inEvent->setDropAction(Qt::MoveAction);
    inEvent->accept();
    return true;
}

bool ZuToolBarDnD::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    if (!d->dragAndDropEnabled)
        return false;
    switch (inEvent->type()) {
    case QEvent::MouseButtonPress: {
        const auto* mouse = dynamic_cast<QMouseEvent*>(inEvent);
        if (mouse && mouse->button() == Qt::LeftButton)
            d->pressPosition = mouse->pos();
        break;
    }
    case QEvent::MouseMove: {
        const auto* mouse = dynamic_cast<QMouseEvent*>(inEvent);
        auto* button = qobject_cast<QToolButton*>(inWatched);
        if (mouse && button && (mouse->buttons() & Qt::LeftButton) &&
            (mouse->pos() - d->pressPosition).manhattanLength() >=
                QApplication::startDragDistance()) {
            d->startDrag(button);
            return true;
        }
        break;
    }
    case QEvent::DragEnter:
        checkDropSupported(static_cast<QDropEvent*>(inEvent), inWatched);
        break;
    case QEvent::Drop: {
        auto* drop = static_cast<QDropEvent*>(inEvent);
        const QByteArray payload = drop->mimeData()->data(kMimeType);
        if (!payload.isEmpty()) {
            d->performDrop(payload);
            return true;
        }
        break;
    }
    default:
        break;
    }
    return QObject::eventFilter(inWatched, inEvent);
}

void ZuToolBarDnD::actionEvent(QActionEvent* inEvent)
{
    QToolBar::actionEvent(inEvent);
    QWidget* widget = widgetForAction(inEvent->action());
    if (inEvent->type() == QEvent::ActionAdded) {
        if (widget) {
            widget->installEventFilter(this);
            widget->setAcceptDrops(true);
        }
    } else if (inEvent->type() == QEvent::ActionRemoved) {
        if (widget)
            widget->removeEventFilter(this);
    }
}

void ZuToolBarDnD::dragEnterEvent(QDragEnterEvent* inEvent)
{
    checkDropSupported(inEvent, this);
}

void ZuToolBarDnD::dropEvent(QDropEvent*) {}
