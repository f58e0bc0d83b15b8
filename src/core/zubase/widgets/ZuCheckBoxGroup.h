#pragma once

#include "zubase/zubase_export.h"

#include <QObject>

#include <memory>

class QCheckBox;

// Ties a set of check boxes to one parent check box. The parent shows checked, unchecked or
// partially checked after its children; clicks on a mixed parent go to all checked, all
// unchecked and back to the mix. The group owns none of the boxes; a destroyed box leaves it.
class ZUBASE_EXPORT ZuCheckBoxGroup : public QObject
{
    Q_OBJECT
public:
    explicit ZuCheckBoxGroup(QObject* inParent = nullptr);
    ~ZuCheckBoxGroup() override;

    // Appends the box (the same box may be listed twice and then counts twice); null is ignored.
    void addCheckBox(QCheckBox* inCheckBox);
    // Removes every entry of the box; null is ignored.
    void removeCheckBox(QCheckBox* inCheckBox);
    // Null clears the parent box.
    void setParentCheckBox(QCheckBox* inCheckBox);
    // Sets every child; without children, sets the parent box.
    void setCheckedAll(bool inChecked);

Q_SIGNALS:
    // A child was clicked.
    void checkBoxClicked(QCheckBox* checkBox);
    // A child changed its check state, also when the group changed it.
    void checkBoxToggled(QCheckBox* checkBox);

private Q_SLOTS:
    void slot_checkBoxClicked();
    void slot_checkBoxToggled();
    void slot_parentCheckBoxStateChanged();

private:
    void updateParentCheckBoxState();

    class Private;
    std::unique_ptr<Private> const d;
};
