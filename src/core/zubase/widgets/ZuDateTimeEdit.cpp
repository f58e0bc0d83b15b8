#include "zubase/ZuDateTimeEdit.h"

#include <QKeyEvent>
#include <QLocale>
#include <QTimer>

#include <private/qdatetimeparser_p.h>

namespace {

// Set while an edit changes its own locale: the change re-validates the text, and that nested
// call must not parse (and switch the locale) again.
bool sChangingLocale = false;

// Parses like the edit's own parser, within the edit's range, in a given format and locale.
class MonthParser : public QDateTimeParser
{
public:
    MonthParser(const QDateTimeEdit* inEdit, const QString& inFormat, const QLocale& inLocale)
        : QDateTimeParser(QMetaType::QDateTime, QDateTimeParser::DateTimeEdit, inEdit->calendar()),
          mEdit(inEdit)
    {
        setDefaultLocale(inLocale);
        parseFormat(inFormat);
    }

protected:
    QDateTime getMinimum() const override { return mEdit->minimumDateTime(); }
    QDateTime getMaximum() const override { return mEdit->maximumDateTime(); }

private:
    const QDateTimeEdit* mEdit;
};

} // namespace

class ZuDateTimeEdit::Private
{
public:
    // Rebuilds the formats when the display format changed by any route.
    void updateFormats(const QString& inDisplayFormat);

    QStringList formats;    // the display format, then its numeric-month variant
    QList<QLocale> locales; // the default locale at construction, then C
    bool monthPending = false;
    QString formatsMadeFor;
};

void ZuDateTimeEdit::Private::updateFormats(const QString& inDisplayFormat)
{
    if (inDisplayFormat == formatsMadeFor && !formats.isEmpty())
        return;
    formatsMadeFor = inDisplayFormat;
    formats = QStringList{inDisplayFormat};
    if (inDisplayFormat.contains(QLatin1String("MMM")))
        formats << QString(inDisplayFormat).replace(QLatin1String("MMM"), QLatin1String("MM"));
}

ZuDateTimeEdit::ZuDateTimeEdit(QWidget* inParent) : QDateTimeEdit(inParent), d(new Private)
{
    d->locales << QLocale() << QLocale::c();
}

ZuDateTimeEdit::~ZuDateTimeEdit() = default;

void ZuDateTimeEdit::setDisplayFormat(const QString& inFormat)
{
    QDateTimeEdit::setDisplayFormat(inFormat);
    d->updateFormats(displayFormat());
}

void ZuDateTimeEdit::keyPressEvent(QKeyEvent* inEvent)
{
    if (inEvent->key() != Qt::Key_Backspace && inEvent->key() != Qt::Key_Delete) {
        QDateTimeEdit::keyPressEvent(inEvent);
        return;
    }
    if (d->monthPending)
        stepBy(0); // back to the text of the current value
    else
        setSelectedSection(currentSection());
    inEvent->accept();
}

QValidator::State ZuDateTimeEdit::validate(QString& ioInput, int& ioPos) const
{
    if (sChangingLocale)
        return QValidator::Intermediate;
    if (currentSection() != QDateTimeEdit::MonthSection)
        return QDateTimeEdit::validate(ioInput, ioPos);

    d->updateFormats(displayFormat());
    QDateTimeParser::StateNode chosen;
    QLocale chosenLocale;
    bool found = false;
    for (const QString& format : d->formats) {
        for (const QLocale& locale : d->locales) {
            const MonthParser parser(this, format, locale);
            const QDateTimeParser::StateNode node = parser.parse(ioInput, ioPos, dateTime(), false);
            if (node.state == QDateTimeParser::Invalid)
                continue;
            if (!found || node.state == QDateTimeParser::Acceptable) {
                chosen = node;
                chosenLocale = locale;
                found = true;
            }
            if (node.state == QDateTimeParser::Acceptable)
                break;
        }
        if (found && chosen.state == QDateTimeParser::Acceptable)
            break;
    }

    if (chosenLocale != locale()) {
        sChangingLocale = true;
        const_cast<ZuDateTimeEdit*>(this)->setLocale(chosenLocale);
        sChangingLocale = false;
    }
    d->monthPending = chosen.state == QDateTimeParser::Intermediate;
    if (chosen.state == QDateTimeParser::Acceptable) {
        const QString text = chosenLocale.toString(chosen.value, displayFormat());
        if (text != ioInput && text.length() > ioInput.length()) {
            auto* self = const_cast<ZuDateTimeEdit*>(this);
            QTimer::singleShot(0, self, [self] { self->focusNextChild(); });
        }
        ioInput = text;
        return QValidator::Acceptable;
    }
    if (chosen.state == QDateTimeParser::Intermediate)
        return QValidator::Intermediate;
    return QDateTimeEdit::validate(ioInput, ioPos);
}
