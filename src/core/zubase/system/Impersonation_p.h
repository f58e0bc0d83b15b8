#pragma once

// Internal: the texts and name rules of the impersonation family, apart from the system calls.
#include <QString>

#include <cstdint>

namespace ZuBase {

// A logon name split into the account name and its domain.
struct LogonName
{
    QString name;
    QString domain;         // "." for the local machine
    bool hasDomain = false; // false for a user principal name (name@domain)
};

// "domain\name" -> name in domain; "name@domain" -> the whole text, no domain; "name" -> name
// in ".".
LogonName splitLogonName(const QString& inUser);
// The user name handed to PAM: the name for a local account (domain "." or this machine's
// name), the whole name of a user principal name, else "domain\name".
QString pamUserName(const LogonName& inName);

// " SE_GROUP_MANDATORY SE_GROUP_ENABLED ..." for a group's attribute bits.
QString groupFlagsText(std::uint32_t inAttributes);
// "[sid]  [domain\\name]  [flags]" (two backslashes between domain and name).
QString groupText(const QString& inSid, const QString& inDomain, const QString& inName,
                  std::uint32_t inAttributes);
// "name  [0x<attributes in lower-case hex>]".
QString privilegeText(const QString& inName, std::uint32_t inAttributes);

} // namespace ZuBase
