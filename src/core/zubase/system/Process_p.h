#pragma once

// Internal: the byte strings that Process::start hands to the system, kept apart so that they
// can be checked as bytes.
#include <QByteArray>
#include <QString>
#include <QStringList>

namespace ZuBase {
namespace ProcessText {

// '"' + path + '"'
QByteArray quotedExecutable(const QString& inExePath);
// One blank before each argument, in Latin-1, neither quoted nor escaped.
QByteArray argumentString(const QStringList& inArguments);
// Quoted executable, one blank, argument string.
QByteArray commandLine(const QString& inExePath, const QStringList& inArguments);
// "NAME=value\0" per usable entry, then two null bytes.
QByteArray environmentBlock(const QStringList& inEnvironment);

} // namespace ProcessText
} // namespace ZuBase
