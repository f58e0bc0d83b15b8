#include "zubase/ZuStartsWithStringValidator.h"

class ZuStartsWithStringValidator::Private
{
public:
    QString prefix;
};

ZuStartsWithStringValidator::ZuStartsWithStringValidator(const QString& inPrefix, QObject* inParent)
    : QValidator(inParent), d(new Private{inPrefix})
{}

ZuStartsWithStringValidator::~ZuStartsWithStringValidator() = default;

QValidator::State ZuStartsWithStringValidator::validate(QString& ioInput, int& ioPos) const
{
    ioPos = qMax(ioPos, d->prefix.length());
    if (ioInput.startsWith(d->prefix, Qt::CaseSensitive))
        return Acceptable;
    if (!ioInput.isEmpty())
        return Invalid;
    ioInput = d->prefix;
    return Acceptable;
}
