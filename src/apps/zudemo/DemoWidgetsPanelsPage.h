#pragma once

#include <QWidget>

// The demo host's "Panels" page: collapsible panels holding grouped check boxes and a flow of
// tags, and the new-layout grid, in place and in a menu.
class DemoWidgetsPanelsPage : public QWidget
{
    Q_OBJECT
public:
    explicit DemoWidgetsPanelsPage(QWidget* inParent = nullptr);
};
