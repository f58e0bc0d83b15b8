#pragma once

#include "zubase/zubase_export.h"

#include <QWidgetAction>

// A menu entry that picks the size of a new layout, columns by rows, by pointing into a grid of
// 10 x 5 squares under the caption "New Layout CxR". Column counts can be kept to multiples of
// a step. Keyboard: arrows move the selection, Enter picks it, Escape closes the menu.
class ZUBASE_EXPORT ZuNewLayoutAction : public QWidgetAction
{
    Q_OBJECT
public:
    // inColumnStep below 1 means 1.
    ZuNewLayoutAction(QWidget* inParent, int inColumnStep);
    ~ZuNewLayoutAction() override;

Q_SIGNALS:
    // The chosen size: columns and rows, each at least 1.
    void layoutSelected(int width, int height);

private Q_SLOTS:
    void gridSelected(int, int);
};
