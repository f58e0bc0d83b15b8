#pragma once

#include <QWidget>

class ZuProgressIcon;

// The demo host's "Tabs, views, dates" page: a tab widget with a new-tab tab and close
// buttons, a worklist lined up by tab stops, a date edit that takes English and local month
// names, turned captions, a pixmap with an overlay, and both progress animations.
class DemoWidgetsViewsPage : public QWidget
{
    Q_OBJECT
public:
    explicit DemoWidgetsViewsPage(QWidget* inParent = nullptr);
    ~DemoWidgetsViewsPage() override;

private:
    ZuProgressIcon* mSpinner = nullptr;
};
