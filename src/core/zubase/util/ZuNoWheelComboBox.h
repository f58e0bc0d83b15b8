#pragma once

#include "zubase/zubase_export.h"

#include <QComboBox>

// A combo box the wheel cannot change: wheel events pass on to its parents, so a scroll area
// around it scrolls instead of changing the current item behind the user's back.
class ZUBASE_EXPORT ZuNoWheelComboBox : public QComboBox
{
    Q_OBJECT
public:
    explicit ZuNoWheelComboBox(QWidget* inParent);
    ~ZuNoWheelComboBox() override;

protected:
    bool event(QEvent* inEvent) override;
};
