#include "zubase/ZuTabBar.h"

#include <QMouseEvent>
#include <QTimer>

namespace {

const QString& newTabText()
{
    static const QString text = QStringLiteral("+");
    return text;
}

} // namespace

ZuTabBar::ZuTabBar(QWidget* inParent) : QTabBar(inParent)
{
    connect(this, SIGNAL(tabMoved(int, int)), this, SLOT(handleTabMoved(int, int)));
}

ZuTabBar::~ZuTabBar() = default;

void ZuTabBar::handleTabMoved(int from, int to)
{
    Q_UNUSED(from);
    // Moving inside the bar's own move handling (a drag in progress) would fight with it.
    if (tabText(to) == newTabText() && to != count() - 1)
        QTimer::singleShot(0, this, &ZuTabBar::fixNewTabPosition);
}

void ZuTabBar::fixNewTabPosition()
{
    for (int index = count() - 1; index >= 0; --index) {
        if (tabText(index) == newTabText() && index != count() - 1)
            moveTab(index, count() - 1);
    }
}

void ZuTabBar::mousePressEvent(QMouseEvent* inEvent)
{
    const int index = tabAt(inEvent->pos());
    if (inEvent->button() == Qt::MiddleButton) {
        if (index >= 0 && tabButton(index, QTabBar::RightSide))
            Q_EMIT tabCloseRequested(index);
    } else if ((inEvent->button() == Qt::LeftButton || inEvent->button() == Qt::RightButton) &&
               index >= 0 && tabText(index) == newTabText()) {
        Q_EMIT newTabMenuRequested();
    } else {
        QTabBar::mousePressEvent(inEvent);
    }
    inEvent->accept();
}

void ZuTabBar::tabInserted(int)
{
    tabLayoutChange(); // a hidden bar lays its tabs out only when shown
}

void ZuTabBar::tabLayoutChange()
{
    // Only names this bar gave are taken back: a host may name its tabs itself.
    const QString name = tr("New tab");
    for (int index = 0; index < count(); ++index) {
        const bool isNewTab = tabText(index) == newTabText();
        const QString current = accessibleTabName(index);
        if (isNewTab && current.isEmpty())
            setAccessibleTabName(index, name);
        else if (!isNewTab && current == name)
            setAccessibleTabName(index, QString());
    }
}
