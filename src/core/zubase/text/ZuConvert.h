#pragma once

#include "zubase/zubase_export.h"

#include <QChar>
#include <QDate>
#include <QString>
#include <QTime>
#include <QtGlobal>

class QScrollArea;
class QWidget;

// Text and conversion helpers the product's programs share. No global state.
namespace Zu {

namespace Format {
// Display formats of dates and times; the values are stored in settings.
enum Format_t
{
    FormatCompact = 0,      // "yyyyMMdd", "hhmmss"
    FormatDayMonthYear = 1, // "d/M/yyyy", "hh:mm:ss"
    FormatYearMonthDay = 2, // "yyyy/MM/dd", "hh:mm:ss"
    FormatMonthName = 3     // "yyyy-MMM-dd", "hh:mm:ss"; also for any other value
};
} // namespace Format

ZUBASE_EXPORT QString dateToString(const QDate& inDate, Format::Format_t inFormat);
ZUBASE_EXPORT QString timeToString(const QTime& inTime, Format::Format_t inFormat);
// Accepts "yyyy/M/d", "d/M/yyyy", "yyyyMMdd" and "yyyy/MMM/dd", with "-" for "/", surrounding
// white space and a trailing part after the first blank (a time) ignored. Invalid if none fits.
ZUBASE_EXPORT QDate dateFromString(const QString& inText);
// "hh:mm:ss", else "hhmmss"; the text is not trimmed. Invalid if neither fits.
ZUBASE_EXPORT QTime timeFromString(const QString& inText);

// Replaces environment references, "%NAME%" or, when the text has no "%" at all, "${NAME}", by the
// variable's value (empty when unset) and rescans the result from its start, so values that
// contain references are expanded in turn. An unterminated reference ends the expansion: the
// text is returned as it stands.
// Bound: at most kMaxEnvironmentReplacements replacements are made per call; values that refer
// to themselves (A=%A%) or to each other would otherwise be expanded for ever. When the bound is
// reached the text is returned as it stands, with the remaining references unexpanded.
ZUBASE_EXPORT QString expandEnvironmentVariables(const QString& inText);
constexpr int kMaxEnvironmentReplacements = 256;

// Turns every character of inFillers into inFill, drops leading and trailing inFill characters
// and reduces every inner run of them to one.
ZUBASE_EXPORT QString replaceFillers(const QString& inText, const QString& inFillers, QChar inFill);

// Resizes inWidget so that the viewport of inArea shows the area's content widget without
// scrolling. Nothing happens when either pointer is null.
ZUBASE_EXPORT void resizeWidgetToViewport(QWidget* inWidget, QScrollArea* inArea);

} // namespace Zu

namespace ZuBase {

// Qt message handler for qInstallMessageHandler() that writes Qt's messages into the core log
// under the tag "Qt": debug, info, warning, critical, fatal as levels 0 to 4 (other types 3),
// "<category>: <text>" when the message has a category. Levels 0 to 2 are hidden from the log's
// write callback. It never aborts, not even for fatal messages.
ZUBASE_EXPORT void logQtMessageToRkLogFile(QtMsgType inType, const QMessageLogContext& inContext,
                                           const QString& inText);

} // namespace ZuBase
