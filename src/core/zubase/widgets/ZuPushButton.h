#pragma once

#include "zubase/zubase_export.h"

#include <QPoint>
#include <QPushButton>

#include <memory>

// A push button that, held down for the popup-menu delay (1000 ms unless set otherwise), gives
// up its click and asks for a popup menu at the cursor instead. The context-menu key and
// Shift+F10 ask for the menu at the button.
class ZUBASE_EXPORT ZuPushButton : public QPushButton
{
    Q_OBJECT
public:
    explicit ZuPushButton(QWidget* inParent = nullptr);
    ~ZuPushButton() override;

    // Milliseconds the button must be held; 0 or less switches the delayed menu off (the keys
    // too), so that holding only clicks.
    void setPopupMenuDelay(int inMilliseconds);

Q_SIGNALS:
    // The button was held for the delay (it is released without a click), or the menu key was
    // pressed; inGlobalPos is the cursor position then, or the button's centre for a key.
    void delayedPopupMenuRequested(const QPoint& inGlobalPos);

private:
    class Private;
    std::unique_ptr<Private> const d;
};
