#include "zubase/ZuCollapsibleWidget.h"

#include <QEvent>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLabel>
#include <QParallelAnimationGroup>
#include <QPointer>
#include <QPropertyAnimation>
#include <QToolButton>

class ZuCollapsibleWidget::Private : public QObject
{
public:
    // Tells a screen reader what the expander does next, with the title it belongs to.
    void updateAccessibleName();
    // Enter and Return work the expander as Space does.
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;

    QGridLayout* mainLayout = nullptr;
    QToolButton* expanderButton = nullptr;
    QLabel* titleLabel = nullptr;
    QFrame* headerFrame = nullptr;
    QWidget* headerHolder = nullptr;
    QFrame* contentFrame = nullptr;
    QGridLayout* contentLayout = nullptr;
    bool expanded = false;
    int headerHeight = 0;
    int contentHeight = 0;
    QPointer<QWidget> headerWidget;
    QPointer<QWidget> contentWidget;
    bool resizeContentDynamically = false;
    QParallelAnimationGroup* animationGroup = nullptr;
    QPropertyAnimation* minimumHeightAnimation = nullptr;
    QPropertyAnimation* maximumHeightAnimation = nullptr;
    QPropertyAnimation* contentAnimation = nullptr;
    QIcon collapsedIcon;
    QIcon expandedIcon;
};

void ZuCollapsibleWidget::Private::updateAccessibleName()
{
    const QString title = titleLabel->text();
    const QString name =
        (expanded ? ZuCollapsibleWidget::tr("Collapse %1") : ZuCollapsibleWidget::tr("Expand %1"))
            .arg(title)
            .trimmed();
    if (expanderButton->accessibleName() != name)
        expanderButton->setAccessibleName(name);
}

bool ZuCollapsibleWidget::Private::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    if (inWatched == expanderButton && inEvent->type() == QEvent::KeyPress) {
        const int key = static_cast<QKeyEvent*>(inEvent)->key();
        if (key == Qt::Key_Return || key == Qt::Key_Enter) {
            expanderButton->click();
            return true;
        }
    }
    return false;
}

namespace {

// The frames show the widget's own background through them.
void setTransparentBackground(QWidget* inWidget, const QPalette& inPalette)
{
    QPalette palette = inPalette;
    palette.setBrush(QPalette::All, QPalette::Window, QBrush(Qt::transparent, Qt::SolidPattern));
    inWidget->setPalette(palette);
}

void clearLayout(QLayout* inLayout)
{
    while (QLayoutItem* item = inLayout->takeAt(0))
        delete item;
}

} // namespace

ZuCollapsibleWidget::ZuCollapsibleWidget(const QString& inTitle, QWidget* inParent)
    : QFrame(inParent), d(new Private)
{
    setFrameShape(QFrame::NoFrame);
    d->mainLayout = new QGridLayout(this);
    d->expanderButton = new QToolButton;
    d->titleLabel = new QLabel;
    d->headerFrame = new QFrame;
    d->headerHolder = new QWidget;
    d->contentFrame = new QFrame;

    setupIcons();

    d->expanderButton->setToolButtonStyle(Qt::ToolButtonIconOnly);
    d->expanderButton->setStyleSheet(QStringLiteral("QToolButton { border: none; }"));
    d->expanderButton->setIcon(getExpanderIcon());
    d->expanderButton->setCheckable(true);
    d->expanderButton->setChecked(false);

    d->titleLabel->setText(inTitle);

    auto* holderLayout = new QGridLayout(d->headerHolder);
    holderLayout->setSpacing(0);
    holderLayout->setContentsMargins(0, 0, 0, 0);

    d->headerFrame->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Minimum);
    d->headerFrame->setFrameShape(QFrame::NoFrame);
    setTransparentBackground(d->headerFrame, palette());
    auto* headerLayout = new QHBoxLayout(d->headerFrame);
    headerLayout->setSizeConstraint(QLayout::SetFixedSize);
    headerLayout->setSpacing(0);
    headerLayout->addWidget(d->expanderButton, 0);
    headerLayout->addWidget(d->titleLabel, 0);
    headerLayout->addWidget(d->headerHolder, 0);
    headerLayout->addStretch(0);

    d->contentFrame->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Maximum);
    d->contentFrame->setFrameShape(QFrame::NoFrame);
    d->contentFrame->setMaximumHeight(0);
    d->contentFrame->setMinimumHeight(0);
    setTransparentBackground(d->contentFrame, palette());
    d->contentLayout = new QGridLayout(d->contentFrame);
    d->contentLayout->setVerticalSpacing(0);
    d->contentLayout->setHorizontalSpacing(0);
    d->contentLayout->setContentsMargins(0, 0, 0, 0);
    d->contentLayout->setSizeConstraint(QLayout::SetNoConstraint);

    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Minimum);
    d->mainLayout->setSpacing(0);
    d->mainLayout->setContentsMargins(0, 0, 0, 0);
    d->mainLayout->addWidget(d->headerFrame, 0, 0, Qt::AlignTop);
    d->mainLayout->addWidget(d->contentFrame, 1, 0, Qt::AlignTop);
    setLayout(d->mainLayout);

    setupAnimation();

    connect(d->expanderButton, &QToolButton::clicked, this,
            &ZuCollapsibleWidget::setExpandedAnimated);
    d->expanderButton->installEventFilter(d.get());
    d->updateAccessibleName();
}

ZuCollapsibleWidget::ZuCollapsibleWidget(QWidget* inParent)
    : ZuCollapsibleWidget(QString(), inParent)
{}

ZuCollapsibleWidget::~ZuCollapsibleWidget() = default;

void ZuCollapsibleWidget::setTitle(const QString& inTitle)
{
    d->titleLabel->setText(inTitle);
    d->updateAccessibleName();
}

void ZuCollapsibleWidget::setHeaderWidget(QWidget* inWidget)
{
    d->headerWidget = inWidget;
    QLayout* layout = d->headerHolder->layout();
    clearLayout(layout);
    if (d->headerWidget)
        layout->addWidget(d->headerWidget);
}

QWidget* ZuCollapsibleWidget::headerWidget() const
{
    return d->headerWidget;
}

void ZuCollapsibleWidget::setContentWidget(QWidget* inWidget)
{
    d->contentWidget = inWidget;
    clearLayout(d->contentLayout);
    if (d->contentWidget)
        d->contentLayout->addWidget(d->contentWidget, 0, 0, Qt::AlignTop);
}

QWidget* ZuCollapsibleWidget::contentWidget() const
{
    return d->contentWidget;
}

void ZuCollapsibleWidget::setHeaderFrameShape(QFrame::Shape inShape)
{
    d->headerFrame->setFrameShape(inShape);
}

void ZuCollapsibleWidget::setContentFrameShape(QFrame::Shape inShape)
{
    d->contentFrame->setFrameShape(inShape);
}

void ZuCollapsibleWidget::setAnimationDuration(int inMilliseconds)
{
    d->minimumHeightAnimation->setDuration(inMilliseconds);
    d->maximumHeightAnimation->setDuration(inMilliseconds);
    d->contentAnimation->setDuration(inMilliseconds);
}

void ZuCollapsibleWidget::setResizeContentDynamically(bool inDynamic)
{
    d->resizeContentDynamically = inDynamic;
}

bool ZuCollapsibleWidget::isExpanded() const
{
    return d->expanded;
}

int ZuCollapsibleWidget::expanderButtonIndent() const
{
    // The title starts after the frame's own border, the header layout's margin and the button.
    return d->expanderButton->sizeHint().width() + d->headerFrame->contentsMargins().left() +
           d->headerFrame->layout()->contentsMargins().left();
}

void ZuCollapsibleWidget::setExpanded(bool expanded)
{
    setExpandedState(expanded);
    if (expanded) {
        d->contentFrame->setMaximumHeight(d->contentHeight);
        setMinimumHeight(d->headerHeight + d->contentHeight);
        setMaximumHeight(d->headerHeight + d->contentHeight);
    } else {
        d->contentFrame->setMaximumHeight(0);
        setMinimumHeight(d->headerHeight);
        setMaximumHeight(d->headerHeight);
    }
}

void ZuCollapsibleWidget::setExpandedAnimated(bool expanded)
{
    setExpandedState(expanded);
    d->animationGroup->setDirection(expanded ? QAbstractAnimation::Forward
                                             : QAbstractAnimation::Backward);
    d->animationGroup->start(QAbstractAnimation::KeepWhenStopped);
}

void ZuCollapsibleWidget::setupIcons()
{
    // Dark arrows on a light background, light ones on a dark background.
    if (palette().color(QPalette::Current, QPalette::Base).value() > 128) {
        d->collapsedIcon = QIcon(QStringLiteral(":/icons/ExpanderClosed_dark"));
        d->expandedIcon = QIcon(QStringLiteral(":/icons/ExpanderOpen_dark"));
    } else {
        d->collapsedIcon = QIcon(QStringLiteral(":/icons/ExpanderClosed"));
        d->expandedIcon = QIcon(QStringLiteral(":/icons/ExpanderOpen"));
    }
}

void ZuCollapsibleWidget::setupAnimation()
{
    d->animationGroup = new QParallelAnimationGroup(this);
    d->minimumHeightAnimation = new QPropertyAnimation(this, "minimumHeight");
    d->maximumHeightAnimation = new QPropertyAnimation(this, "maximumHeight");
    d->contentAnimation = new QPropertyAnimation(d->contentFrame, "maximumHeight");
    d->animationGroup->addAnimation(d->minimumHeightAnimation);
    d->animationGroup->addAnimation(d->maximumHeightAnimation);
    d->animationGroup->addAnimation(d->contentAnimation);
    setAnimationDuration(150);
}

QIcon ZuCollapsibleWidget::getExpanderIcon() const
{
    return d->expanded ? d->expandedIcon : d->collapsedIcon;
}

void ZuCollapsibleWidget::setExpandedState(bool inExpanded)
{
    d->expanded = inExpanded;
    d->expanderButton->setChecked(inExpanded);
    d->expanderButton->setIcon(getExpanderIcon());
    updateHeights();
    updateAnimationValues();
    d->updateAccessibleName();
}

void ZuCollapsibleWidget::updateHeights()
{
    d->headerHeight = d->headerFrame->sizeHint().height() + 1;
    d->contentHeight = 0;
    if (QWidget* content = d->contentWidget) {
        d->contentHeight = content->hasHeightForWidth()
                               ? content->heightForWidth(d->contentFrame->width())
                               : content->sizeHint().height();
    }
}

void ZuCollapsibleWidget::updateAnimationValues()
{
    const int expandedHeight = d->headerHeight + d->contentHeight;
    d->minimumHeightAnimation->setStartValue(d->headerHeight);
    d->minimumHeightAnimation->setEndValue(expandedHeight);
    d->maximumHeightAnimation->setStartValue(d->headerHeight);
    d->maximumHeightAnimation->setEndValue(expandedHeight);
    d->contentAnimation->setStartValue(0);
    d->contentAnimation->setEndValue(d->contentHeight);
}

void ZuCollapsibleWidget::resizeEvent(QResizeEvent* inEvent)
{
    QFrame::resizeEvent(inEvent);
    if (d->resizeContentDynamically && d->expanded && d->contentWidget &&
        d->animationGroup->state() != QAbstractAnimation::Running)
        setExpanded(true);
}
