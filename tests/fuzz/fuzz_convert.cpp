// Date, time, environment and filler helpers on arbitrary text: no crash, no hang, and what
// callers rely on: a parsed time reads back as its text, a parsed date survives the display
// formats, expansion is bounded and leaves texts without references alone, fillers collapse.
#include "zubase/ZuConvert.h"

#include <QRegularExpression>

#include <cstdint>
#include <cstdlib>

namespace {

void check(bool inCondition)
{
    if (!inCondition)
        std::abort();
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    qputenv("ZU_A", "alpha");
    qputenv("ZU_SELF", "%ZU_SELF%");
    qputenv("ZU_GROW", "%ZU_GROW%x");
    qputenv("ZU_P", "%ZU_Q%");
    qputenv("ZU_Q", "${ZU_P}");
    qputenv("ZU_PCT", "50%");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(inData), int(inSize));

    // Qt's number sections also take signs ("1230+5" is 12:30:05), so the read-back holds for
    // digits and colons.
    static const QRegularExpression digitsAndColons(QStringLiteral("^[0-9:]*$"));
    const QTime time = Zu::timeFromString(text);
    check(!time.isValid() || !digitsAndColons.match(text).hasMatch() ||
          time.toString(QStringLiteral("hh:mm:ss")) == text ||
          time.toString(QStringLiteral("hhmmss")) == text);
    const QDate date = Zu::dateFromString(text);
    if (date.isValid() && date.year() >= 1000 && date.year() <= 9999) {
        for (const auto format : {Zu::Format::FormatCompact, Zu::Format::FormatDayMonthYear,
                                  Zu::Format::FormatYearMonthDay, Zu::Format::FormatMonthName})
            check(Zu::dateFromString(Zu::dateToString(date, format)) == date);
    }

    // At most kMaxEnvironmentReplacements values, none longer than "%ZU_GROW%x".
    const QString expanded = Zu::expandEnvironmentVariables(text);
    check(expanded.size() <= text.size() + 10 * Zu::kMaxEnvironmentReplacements);
    if (!text.contains(QLatin1Char('%')) && !text.contains(QLatin1String("${")))
        check(expanded == text);

    // No filler left, no blank at the ends or twice, and nothing else lost.
    const QString filled = Zu::replaceFillers(text, QStringLiteral("-/"), QLatin1Char(' '));
    check(!filled.startsWith(QLatin1Char(' ')) && !filled.endsWith(QLatin1Char(' ')) &&
          !filled.contains(QLatin1String("  ")) && !filled.contains(QLatin1Char('-')) &&
          !filled.contains(QLatin1Char('/')));
    static const QRegularExpression fillersAndBlanks(QStringLiteral("[-/ ]"));
    check(QString(filled).remove(QLatin1Char(' ')) == QString(text).remove(fillersAndBlanks));
    return 0;
}
