#include "zubase/ZuRegExpValidator.h"

ZuRegExpValidator::ZuRegExpValidator(QObject* inParent) : QRegExpValidator(inParent) {}

ZuRegExpValidator::ZuRegExpValidator(const QRegExp& inRegExp, QObject* inParent)
    : QRegExpValidator(inRegExp, inParent)
{}

ZuRegExpValidator::~ZuRegExpValidator() = default;

QValidator::State ZuRegExpValidator::validate(QString& ioInput, int& ioPos) const
{
    const State state = QRegExpValidator::validate(ioInput, ioPos);
    return state == Intermediate ? Invalid : state;
}
