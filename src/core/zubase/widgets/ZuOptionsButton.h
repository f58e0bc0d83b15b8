#pragma once

#include "zubase/zubase_export.h"

#include <QToolButton>

#include <memory>

// A down-arrow tool button, the drop-down button of combo-like fields. Given a constraint
// widget it takes that widget's hinted height (and its own minimum width) at the next resize or
// font change. It never draws the extra menu indicator. Accessible name: "Open menu".
class ZUBASE_EXPORT ZuOptionsButton : public QToolButton
{
    Q_OBJECT
public:
    explicit ZuOptionsButton(QWidget* inParent);
    ~ZuOptionsButton() override;

    // The widget whose height the button takes; only stored, the size follows at the next
    // resize or font change. Not owned; a widget destroyed meanwhile is forgotten.
    void setConstraintWidget(QWidget* inWidget);

protected:
    bool event(QEvent* inEvent) override;
    void paintEvent(QPaintEvent* inEvent) override;
    // Also run with no event when the font changes.
    void resizeEvent(QResizeEvent* inEvent) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
