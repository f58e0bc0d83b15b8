#pragma once

// Internal parts of PnResource, reachable by the language selector and by white-box tests.
#include <QByteArray>
#include <QString>

namespace PnResource {

// Reads the registry file into the registry bundle; false (and the defaults stay) when it
// cannot be read or is malformed, with the reason as a warning.
bool readRegistry();

// The installation root as text, decoded with the local 8-bit encoding.
QString rootPath();

// What an executable's "--version" output tells: the protocol version (digits and dots, empty
// when not found) and the version text (up to the first ")", without a leading "Version ";
// empty when there is none or when it cannot be stored in the registry as one line).
struct VersionProbe
{
    QByteArray protocolVersion;
    QByteArray versionText;
};
VersionProbe parseVersionOutput(const QByteArray& inOutput);

} // namespace PnResource
