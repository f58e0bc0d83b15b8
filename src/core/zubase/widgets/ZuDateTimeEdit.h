#pragma once

#include "zubase/zubase_export.h"

#include <QDateTimeEdit>

#include <memory>

// A date-time edit that takes month names typed in the user's language or in English, also a
// month number where the format shows a name ("MMM"), and on which Backspace and Delete select
// the whole section instead of deleting characters. Typing an English name switches the edit
// to the C locale; the display format is whatever the host sets.
class ZUBASE_EXPORT ZuDateTimeEdit : public QDateTimeEdit
{
    Q_OBJECT
public:
    explicit ZuDateTimeEdit(QWidget* inParent = nullptr);
    ~ZuDateTimeEdit() override;

    // Also learns the numeric-month variant of a format with "MMM". A format set through the
    // displayFormat property or a QDateTimeEdit pointer is picked up as well.
    void setDisplayFormat(const QString& inFormat);

protected:
    void keyPressEvent(QKeyEvent* inEvent) override;
    QValidator::State validate(QString& ioInput, int& ioPos) const override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
