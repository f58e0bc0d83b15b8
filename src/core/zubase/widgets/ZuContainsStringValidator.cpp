#include "zubase/ZuContainsStringValidator.h"

class ZuContainsStringValidator::Private
{
public:
    QString required;
};

ZuContainsStringValidator::ZuContainsStringValidator(const QString& inRequired, QObject* inParent)
    : QValidator(inParent), d(new Private{inRequired})
{}

ZuContainsStringValidator::~ZuContainsStringValidator() = default;

QValidator::State ZuContainsStringValidator::validate(QString& ioInput, int&) const
{
    if (ioInput.contains(d->required, Qt::CaseSensitive))
        return Acceptable;
    if (!ioInput.isEmpty())
        return Invalid;
    ioInput = d->required;
    return Acceptable;
}
