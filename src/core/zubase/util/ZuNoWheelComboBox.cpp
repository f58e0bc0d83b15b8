#include "zubase/ZuNoWheelComboBox.h"

#include <QEvent>

ZuNoWheelComboBox::ZuNoWheelComboBox(QWidget* inParent) : QComboBox(inParent) {}

ZuNoWheelComboBox::~ZuNoWheelComboBox() = default;

bool ZuNoWheelComboBox::event(QEvent* inEvent)
{
    // Not handled: QApplication passes an unhandled wheel event on to the parent widgets.
    if (inEvent->type() == QEvent::Wheel)
        return false;
    return QComboBox::event(inEvent);
}
