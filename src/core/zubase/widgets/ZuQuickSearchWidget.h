#pragma once

#include "zubase/zubase_export.h"

#include <QWidget>

#include <memory>

// A filter field for lists and tables: a line edit ("Enter Search Filter", accessible name
// "Search filter") and a "Clear" button. Reports the search string once typing has paused for
// the search delay (400 ms unless set otherwise), and at once when the field is cleared by the
// button or by Escape. Escape in an empty field is left to the window (a dialog still closes).
class ZUBASE_EXPORT ZuQuickSearchWidget : public QWidget
{
    Q_OBJECT
public:
    explicit ZuQuickSearchWidget(QWidget* inParent);
    ~ZuQuickSearchWidget() override;

    // Milliseconds of quiet after an edit before it is reported.
    int searchDelay() const;
    // 0 or less reports every edit at once.
    void setSearchDelay(int inMilliseconds);

Q_SIGNALS:
    // The line edit's text; only user edits and clearing report, text set by code does not.
    void searchStringChanged(const QString& inString);

private:
    class Private;
    std::unique_ptr<Private> const d;
};
