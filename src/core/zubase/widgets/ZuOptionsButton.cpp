#include "zubase/ZuOptionsButton.h"

#include <QEvent>
#include <QPainter>
#include <QPointer>
#include <QStyleOptionToolButton>

class ZuOptionsButton::Private
{
public:
    QPointer<QWidget> constraintWidget; // not owned, may die first
};

ZuOptionsButton::ZuOptionsButton(QWidget* inParent) : QToolButton(inParent), d(new Private)
{
    setArrowType(Qt::DownArrow);
    setFocusPolicy(Qt::StrongFocus);
    // A bare arrow says nothing to a screen reader.
    setAccessibleName(tr("Open menu"));
}

ZuOptionsButton::~ZuOptionsButton() = default;

void ZuOptionsButton::setConstraintWidget(QWidget* inWidget)
{
    d->constraintWidget = inWidget;
}

bool ZuOptionsButton::event(QEvent* inEvent)
{
    if (inEvent->type() == QEvent::FontChange)
        resizeEvent(nullptr);
    return QToolButton::event(inEvent);
}

void ZuOptionsButton::paintEvent(QPaintEvent*)
{
    QPainter painter(this);
    QStyleOptionToolButton option;
    initStyleOption(&option);
    option.features &= ~QStyleOptionToolButton::HasMenu;
    style()->drawComplexControl(QStyle::CC_ToolButton, &option, &painter, this);
}

void ZuOptionsButton::resizeEvent(QResizeEvent*)
{
    if (!d->constraintWidget)
        return;
    setFixedSize(minimumSizeHint().width(), d->constraintWidget->sizeHint().height());
}
