#include "zubase/ZuTabWidget.h"

#include "zubase/ZuTabBar.h"

#include <QIcon>
#include <QToolButton>
#include <QVariant>

namespace {

// Marks the buttons setCloseButton() made, so that a replaced one is deleted and a host's own
// right-side widget is not.
const char* const kCloseButtonProperty = "_zu_tabCloseButton";

} // namespace

ZuTabWidget::ZuTabWidget(QWidget* inParent) : QTabWidget(inParent)
{
    auto* bar = new ZuTabBar(this);
    setTabBar(bar);
    connect(bar, SIGNAL(tabCloseRequested(int)), this, SLOT(handleTabCloseRequested(int)));
    connect(bar, SIGNAL(newTabMenuRequested()), this, SLOT(handleNewTabMenuRequested()));
    connect(bar, SIGNAL(tabMoved(int, int)), this, SIGNAL(tabMoved(int, int)));
    bar->setUsesScrollButtons(true);
    setElideMode(Qt::ElideNone);
}

ZuTabWidget::~ZuTabWidget() = default;

void ZuTabWidget::setCloseButton(int inIndex, const QIcon& inIcon)
{
    QTabBar* bar = tabBar();
    if (inIndex < 0 || inIndex >= bar->count())
        return; // the bar would ignore the button and leave it without a parent
    QWidget* previous = bar->tabButton(inIndex, QTabBar::RightSide);
    auto* button = new QToolButton(bar);
    button->setAutoRaise(true);
    button->setIcon(inIcon);
    button->setIconSize(QSize(14, 14));
    button->setFixedSize(18, 18);
    button->setStyleSheet(QStringLiteral(
        "color: rgba(0, 255, 0, 0%); background-color: rgba(0, 0, 0, 0%); border: 0px;"));
    button->setAccessibleName(tr("Close tab"));
    button->setProperty(kCloseButtonProperty, true);
    connect(button, SIGNAL(clicked()), this, SLOT(closeTab()));
    bar->setTabButton(inIndex, QTabBar::RightSide, button);
    if (previous && previous->property(kCloseButtonProperty).toBool())
        previous->deleteLater();
}

void ZuTabWidget::handleTabCloseRequested(int tabToClose)
{
    // QTabWidget::setTabsClosable() relays the bar's requests as well; that relay goes, so
    // that the host hears each request once and does not close two tabs.
    if (sender() == tabBar())
        disconnect(tabBar(), SIGNAL(tabCloseRequested(int)), this, SIGNAL(tabCloseRequested(int)));
    Q_EMIT tabCloseRequested(tabToClose);
}

void ZuTabWidget::handleNewTabMenuRequested()
{
    Q_EMIT newTabMenuRequested();
}

void ZuTabWidget::closeTab()
{
    const QObject* button = sender();
    if (!button)
        return;
    const QTabBar* bar = tabBar();
    for (int index = 0; index < bar->count(); ++index) {
        if (bar->tabButton(index, QTabBar::RightSide) == button) {
            Q_EMIT tabCloseRequested(index);
            return;
        }
    }
}
