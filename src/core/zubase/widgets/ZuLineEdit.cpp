#include "zubase/ZuLineEdit.h"

#include <QFontMetrics>

class ZuLineEdit::Private
{
public:
    QString textForMinimumSize;
};

ZuLineEdit::ZuLineEdit(QWidget* inParent) : QLineEdit(inParent), d(new Private) {}

ZuLineEdit::~ZuLineEdit() = default;

void ZuLineEdit::setTextForMinimumSize(const QString& inText)
{
    d->textForMinimumSize = inText;
}

QSize ZuLineEdit::sizeHint() const
{
    return minimumSizeHint();
}

QSize ZuLineEdit::minimumSizeHint() const
{
    QSize size = QLineEdit::minimumSizeHint();
    const QFontMetrics metrics(font());
    size.setWidth(
        qMax(metrics.horizontalAdvance(d->textForMinimumSize), metrics.horizontalAdvance(text())));
    return size;
}
