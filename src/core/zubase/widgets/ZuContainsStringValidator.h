#pragma once

#include "zubase/zubase_export.h"

#include <QValidator>

#include <memory>

// Accepts text that contains a required string (case-sensitive) and fills an emptied field
// with that string, so the field never ends up without it.
class ZUBASE_EXPORT ZuContainsStringValidator : public QValidator
{
public:
    ZuContainsStringValidator(const QString& inRequired, QObject* inParent);
    ~ZuContainsStringValidator() override;

    // Acceptable when ioInput contains the string; an empty ioInput becomes the string and is
    // Acceptable; anything else is Invalid. ioPos is left alone.
    QValidator::State validate(QString& ioInput, int& ioPos) const override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
