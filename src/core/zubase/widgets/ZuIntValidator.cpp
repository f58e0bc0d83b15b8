#include "zubase/ZuIntValidator.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace {

// Converting a double outside the int range is undefined (1e10 came out as INT_MIN), so cut
// it to the range before truncating.
int toIntBound(double inValue, int inOpenSide)
{
    if (std::isnan(inValue))
        return inOpenSide;
    return static_cast<int>(std::clamp(inValue, double(std::numeric_limits<int>::min()),
                                       double(std::numeric_limits<int>::max())));
}

} // namespace

ZuIntValidator::ZuIntValidator(QObject* inParent) : QIntValidator(inParent) {}

ZuIntValidator::ZuIntValidator(double inBottom, double inTop, QObject* inParent)
    : QIntValidator(toIntBound(inBottom, std::numeric_limits<int>::min()),
                    toIntBound(inTop, std::numeric_limits<int>::max()), inParent)
{}

ZuIntValidator::~ZuIntValidator() = default;

QValidator::State ZuIntValidator::validate(QString& ioInput, int& ioPos) const
{
    const State state = QIntValidator::validate(ioInput, ioPos);
    if (state == Invalid)
        fixup(ioInput);
    return state;
}

void ZuIntValidator::fixup(QString& ioInput) const
{
    bool ok = false;
    const int value = ioInput.toInt(&ok, 10);
    if (ok)
        ioInput = QString::number(qMin(qMax(value, bottom()), top()));
}
