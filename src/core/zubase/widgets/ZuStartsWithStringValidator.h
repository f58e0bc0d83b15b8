#pragma once

#include "zubase/zubase_export.h"

#include <QValidator>

#include <memory>

// Keeps a fixed prefix at the start of a field: text without the prefix (case-sensitive) is
// refused, the cursor cannot enter it, and an emptied field gets the prefix back.
class ZUBASE_EXPORT ZuStartsWithStringValidator : public QValidator
{
public:
    ZuStartsWithStringValidator(const QString& inPrefix, QObject* inParent);
    ~ZuStartsWithStringValidator() override;

    // ioPos is moved behind the prefix first; then Acceptable when ioInput starts with the
    // prefix, Acceptable with ioInput set to the prefix when it is empty, else Invalid.
    QValidator::State validate(QString& ioInput, int& ioPos) const override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
