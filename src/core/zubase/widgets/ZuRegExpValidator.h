#pragma once

#include "zubase/zubase_export.h"

#include <QRegExpValidator>

// A regular-expression validator without partial matches: only text that matches the whole
// expression is accepted, so every keystroke must keep the text fully matching.
class ZUBASE_EXPORT ZuRegExpValidator : public QRegExpValidator
{
public:
    explicit ZuRegExpValidator(QObject* inParent = nullptr);
    ZuRegExpValidator(const QRegExp& inRegExp, QObject* inParent);
    ~ZuRegExpValidator() override;

    // Acceptable or Invalid; what QRegExpValidator calls Intermediate is Invalid here.
    QValidator::State validate(QString& ioInput, int& ioPos) const override;
};
