#include "zubase/ZuConvert.h"

#include "rklib/RkLogFile.h"

namespace Zu {

namespace {

QString datePattern(Format::Format_t inFormat)
{
    switch (inFormat) {
    case Format::FormatCompact:
        return QStringLiteral("yyyyMMdd");
    case Format::FormatDayMonthYear:
        return QStringLiteral("d/M/yyyy");
    case Format::FormatYearMonthDay:
        return QStringLiteral("yyyy/MM/dd");
    default:
        return QStringLiteral("yyyy-MMM-dd");
    }
}

} // namespace

QString dateToString(const QDate& inDate, Format::Format_t inFormat)
{
    return inDate.toString(datePattern(inFormat));
}

QString timeToString(const QTime& inTime, Format::Format_t inFormat)
{
    return inTime.toString(inFormat == Format::FormatCompact ? QStringLiteral("hhmmss")
                                                             : QStringLiteral("hh:mm:ss"));
}

QDate dateFromString(const QString& inText)
{
    QString text = inText.trimmed();
    text.replace(QLatin1Char('-'), QLatin1Char('/'));
    const int blank = text.indexOf(QLatin1Char(' '));
    if (blank >= 0)
        text.truncate(blank);

    static const char* const kPatterns[] = {"yyyy/M/d", "d/M/yyyy", "yyyyMMdd", "yyyy/MMM/dd"};
    QDate date;
    for (const char* pattern : kPatterns) {
        date = QDate::fromString(text, QLatin1String(pattern));
        if (date.isValid())
            break;
    }
    return date;
}

QTime timeFromString(const QString& inText)
{
    const QTime time = QTime::fromString(inText, QStringLiteral("hh:mm:ss"));
    if (time.isValid())
        return time;
    return QTime::fromString(inText, QStringLiteral("hhmmss"));
}

QString expandEnvironmentVariables(const QString& inText)
{
    QString text = inText;
    for (int replacements = 0; replacements < kMaxEnvironmentReplacements; ++replacements) {
        int start = text.indexOf(QLatin1Char('%'));
        int nameStart = 0;
        int end = -1;
        if (start >= 0) {
            nameStart = start + 1;
            end = text.indexOf(QLatin1Char('%'), nameStart);
        } else {
            start = text.indexOf(QLatin1String("${"));
            if (start < 0)
                return text;
            nameStart = start + 2;
            end = text.indexOf(QLatin1Char('}'), nameStart);
        }
        if (end < 0)
            return text;
        const QByteArray name = text.mid(nameStart, end - nameStart).toLocal8Bit();
        const QString value = QString::fromLocal8Bit(qgetenv(name.constData()));
        text.replace(start, end + 1 - start, value);
    }
    return text;
}

QString replaceFillers(const QString& inText, const QString& inFillers, QChar inFill)
{
    QString result;
    result.reserve(inText.size());
    bool pendingFill = false;
    for (const QChar c : inText) {
        if (c == inFill || inFillers.contains(c)) {
            pendingFill = !result.isEmpty();
            continue;
        }
        if (pendingFill)
            result.append(inFill);
        pendingFill = false;
        result.append(c);
    }
    return result;
}

} // namespace Zu

namespace ZuBase {

void logQtMessageToRkLogFile(QtMsgType inType, const QMessageLogContext& inContext,
                             const QString& inText)
{
    RkLogLevel level = RkLogError;
    switch (inType) {
    case QtDebugMsg:
        level = RkLogDebug;
        break;
    case QtInfoMsg:
        level = RkLogInfo;
        break;
    case QtWarningMsg:
        level = RkLogWarning;
        break;
    case QtCriticalMsg:
        level = RkLogError;
        break;
    case QtFatalMsg:
        level = RkLogFatal;
        break;
    }
    const QByteArray text = inText.toLocal8Bit();

    // Debug, info and warnings of Qt are too chatty for the host's callback (often a dialog).
    RkLogFileWriteCallbackDisabler disabler;
    if (level <= RkLogWarning)
        disabler.disableWriteCallback();
    if (inContext.category && *inContext.category)
        getTheLogInstance().tracef(level, "Qt", "%s: %s", inContext.category, text.constData());
    else
        getTheLogInstance().tracef(level, "Qt", "%s", text.constData());
    disabler.restoreWriteCallback();
}

} // namespace ZuBase
