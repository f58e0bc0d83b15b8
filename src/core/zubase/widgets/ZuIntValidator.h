#pragma once

#include "zubase/zubase_export.h"

#include <QIntValidator>

// An integer validator that clamps: input it rejects is also corrected in place to the nearest
// end of the range, and fixup() clamps any integer to the range.
class ZUBASE_EXPORT ZuIntValidator : public QIntValidator
{
public:
    explicit ZuIntValidator(QObject* inParent = nullptr);
    // The bounds are cut to the int range first, then truncated toward zero (0.9 gives 0);
    // NaN leaves that side open.
    ZuIntValidator(double inBottom, double inTop, QObject* inParent);
    ~ZuIntValidator() override;

    // QIntValidator's answer; when it is Invalid, ioInput is also clamped by fixup(). On Qt
    // 5.15 a number with no more digits than the top is Intermediate (25 for 1..10; Qt 5.5 said
    // Invalid) and stays as typed; a QLineEdit clamps it through fixup() when editing ends.
    QValidator::State validate(QString& ioInput, int& ioPos) const override;
    // A base-10 integer is replaced by its value clamped to [bottom, top]; other text is kept.
    void fixup(QString& ioInput) const override;
};
