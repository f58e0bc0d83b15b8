#pragma once

#include "zubase/zubase_export.h"

#include <QTabBar>

// A tab bar with a browser-like new-tab tab: the host adds an ordinary tab with the text "+"
// as the last one. The bar keeps it last while tabs are dragged, reports presses on it as
// newTabMenuRequested() instead of selecting it, and asks to close a tab on a middle click
// (tabs with a right-side button only).
class ZUBASE_EXPORT ZuTabBar : public QTabBar
{
    Q_OBJECT
public:
    explicit ZuTabBar(QWidget* inParent = nullptr);
    ~ZuTabBar() override;

Q_SIGNALS:
    // A left or right press on the "+" tab; that tab never becomes current through the mouse.
    void newTabMenuRequested();

protected Q_SLOTS:
    // Schedules fixNewTabPosition() when a move left the "+" tab anywhere but last.
    void handleTabMoved(int from, int to);
    // Moves every "+" tab that is not last to the end.
    void fixNewTabPosition();

protected:
    void mousePressEvent(QMouseEvent* inEvent) override;
    // Screen readers hear "New tab" for the "+" tab.
    void tabInserted(int inIndex) override;
    void tabLayoutChange() override;
};
