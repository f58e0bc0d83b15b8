#pragma once

#include <QWidget>

class QLabel;

// The demo host's page of popup-menu fields, buttons with delayed menus, the quick search and
// the reorderable tool bar, each in use; the line at the bottom tells what they reported.
class DemoWidgetsFieldsPage : public QWidget
{
    Q_OBJECT
public:
    explicit DemoWidgetsFieldsPage(QWidget* inParent = nullptr);

private:
    void report(const QString& inText);

    QLabel* mReport = nullptr;
};
