#pragma once

#include "zubase/ZuPopupMenuLineEdit.h"
#include "zubase/zubase_export.h"

#include <memory>

class QAction;
class QMenu;

// A popup-menu line edit with a drop-down button (a ZuOptionsButton) at its right end and a
// QMenu that drops down below it, or opens upward where the desktop ends. Read-only, the whole
// field is the menu's button; editable, it is a line edit with a menu button. Alt+Down and F4
// open the menu from the keyboard.
class ZUBASE_EXPORT ZuPopupMenuComboBox : public ZuPopupMenuLineEdit
{
    Q_OBJECT
public:
    explicit ZuPopupMenuComboBox(QWidget* inParent = nullptr, const char* inName = nullptr);
    // Deletes the menu set last, unless it has been destroyed already.
    ~ZuPopupMenuComboBox() override;

    // The menu to show (null allowed). The combo box deletes the menu it holds when it is
    // destroyed; a menu replaced here is left to its owner.
    void setPopupMenu(QMenu* inMenu);
    QMenu* popupMenu() const;

Q_SIGNALS:
    // About to show the menu, which may be created and set from here.
    void popupAboutToShow();
    // A choice in the menu.
    void popupActivated(QAction* inAction);

public Q_SLOTS:
    // Emits popupActivated(inAction).
    void emitPopupActivated(QAction* inAction);
    // Emits popupAboutToShow() and shows the menu, unless it is showing already.
    void popup();
    // Lifts the drop-down button.
    void unsetButton();
    // Takes the current scheme's palette for the field and its button.
    void paletteChanged();

protected:
    void mousePressEvent(QMouseEvent* inEvent) override;
    void mouseReleaseEvent(QMouseEvent* inEvent) override;
    void enterEvent(QEvent* inEvent) override;
    void leaveEvent(QEvent* inEvent) override;
    // Keeps the button a square at the right end.
    void resizeEvent(QResizeEvent* inEvent) override;
    void highlight(bool inOn) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
