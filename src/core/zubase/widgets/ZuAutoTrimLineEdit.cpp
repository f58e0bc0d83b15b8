#include "zubase/ZuAutoTrimLineEdit.h"

#include <QRegExp>

ZuAutoTrimLineEdit::ZuAutoTrimLineEdit(QWidget* inParent) : QLineEdit(inParent)
{
    connect(this, &QLineEdit::editingFinished, this, &ZuAutoTrimLineEdit::trimLineBreaks);
}

ZuAutoTrimLineEdit::~ZuAutoTrimLineEdit() = default;

void ZuAutoTrimLineEdit::trimLineBreaks()
{
    static const QRegExp lineBreaks(QStringLiteral("[\n\t\r]"), Qt::CaseSensitive, QRegExp::RegExp);
    QString cleaned = text().trimmed();
    cleaned.replace(lineBreaks, QStringLiteral(" "));
    setText(cleaned);
}
