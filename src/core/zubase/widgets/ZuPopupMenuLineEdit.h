#pragma once

#include "zubase/zubase_export.h"

#include <QLineEdit>

#include <memory>

class QToolButton;

// A frameless line edit in the colours of the viewer controls (the scheme's
// "ZIVOD_ViewerControl" behind "ZIVOD_White", else the palette's Window and WindowText). It
// lights up under the mouse, reports its text as accepted on Return, on Tab (which keeps the
// focus) and once when it loses the focus, and re-colours itself on every scheme switch.
class ZUBASE_EXPORT ZuPopupMenuLineEdit : public QLineEdit
{
    Q_OBJECT
public:
    // inName is the object name, read as Latin-1.
    explicit ZuPopupMenuLineEdit(QWidget* inParent = nullptr, const char* inName = nullptr);
    ~ZuPopupMenuLineEdit() override;

Q_SIGNALS:
    void textAccepted(const QString& inText);
    // Editing starts at that cursor position (a click, or activateEditing()).
    void startEditingAtPosition(int inPosition);

public Q_SLOTS:
    // Emits textAccepted(text()).
    void acceptText();
    // Takes the current scheme's palette and re-applies the hover state.
    void paletteChanged();
    // Emits startEditingAtPosition(cursorPosition()), then takes the focus as if clicked.
    void activateEditing();

public:
    // Gives any line edit the viewer-control colours, no frame and no dragging of text.
    static void skinify(QLineEdit* inLineEdit);
    // Gives a tool button the library's style (owned by the button) and auto-raise.
    static void skinify(QToolButton* inButton);

protected:
    bool event(QEvent* inEvent) override;
    void mousePressEvent(QMouseEvent* inEvent) override;
    void focusOutEvent(QFocusEvent* inEvent) override;
    void enterEvent(QEvent* inEvent) override;
    void leaveEvent(QEvent* inEvent) override;
    // Colours the field for the hover state: the viewer-control colour lightened to 130 %, or
    // the palette's Light colour where the scheme has none.
    virtual void highlight(bool inOn);

private:
    class Private;
    std::unique_ptr<Private> const d;
};
