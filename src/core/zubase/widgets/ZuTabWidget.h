#pragma once

#include "zubase/zubase_export.h"

#include <QTabWidget>

class QIcon;

// A tab widget on a ZuTabBar: relays the bar's new-tab and close requests as its own signals
// and puts small flat close buttons on tabs. Adding the "+" tab, building the new-tab menu and
// removing closed tabs stay with the host.
class ZUBASE_EXPORT ZuTabWidget : public QTabWidget
{
    Q_OBJECT
public:
    explicit ZuTabWidget(QWidget* inParent = nullptr);
    ~ZuTabWidget() override;

    // Puts an 18 x 18 flat button with the icon (14 x 14) on the right side of the tab; a
    // click emits tabCloseRequested() with the tab's index at that moment. Replaces a close
    // button the tab had. An index out of range is ignored.
    void setCloseButton(int inIndex, const QIcon& inIcon);

Q_SIGNALS:
    void newTabMenuRequested();
    void tabMoved(int from, int to);

protected Q_SLOTS:
    void handleTabCloseRequested(int tabToClose);
    void handleNewTabMenuRequested();
    // The sender is a close button; the tab that carries it is asked to close.
    void closeTab();
};
