#include "zubase/PnResource.h"

#include "zubase/install/PnResource_p.h"
#include "zubase/platform/SysProcess.h"

#include "pnresources/PnResourceLayer.h"
#include "pnresources/VelmarMesh.h"
#include "rklib/RkFilename.h"
#include "rklib/RkLogFile.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QProcess>
#include <QSaveFile>
#include <QSettings>
#include <QStandardPaths>

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

namespace {

constexpr int kProbeWaitMs = 2000;
const char kOtherVersion[] = "OtherVersion";
const int kOtherVersionLength = 12;

QString decode(const std::string& inPath)
{
    return QFile::decodeName(QByteArray::fromStdString(inPath));
}

std::string encode(const QString& inPath)
{
    return QFile::encodeName(inPath).toStdString();
}

bool isDigit(char inChar)
{
    return inChar >= '0' && inChar <= '9';
}

// The leading integer of a version text, like atoi but without overflow.
int leadingInteger(const std::string& inText)
{
    long long value = 0;
    for (const char c : inText) {
        if (!isDigit(c))
            break;
        value = std::min<long long>(value * 10 + (c - '0'), INT_MAX);
    }
    return int(value);
}

// Text that can stand in a registry line: valid UTF-8 without control characters (the reader
// refuses the whole file otherwise).
bool isStorableText(const QByteArray& inText)
{
    for (const char c : inText) {
        const auto byte = static_cast<unsigned char>(c);
        if ((byte < 0x20 && c != '\t') || byte == 0x7F)
            return false;
    }
    return QString::fromUtf8(inText).toUtf8() == inText;
}

// One accepted OtherVersion entry: its protocol version and the text behind the name.
struct Entry
{
    RkVersion version;
    std::string text;
};

// Runs "<executable> --version" and returns what it wrote to its standard output. The program
// gets its path and the argument as such (no command line to split, so folders with blanks
// work) and an empty standard input; it is killed when it does not end in time.
QByteArray runVersionProbe(const std::string& inExecutable)
{
    QProcess process;
    process.setProgram(decode(inExecutable));
    process.setArguments({QStringLiteral("--version")});
    process.setStandardInputFile(QProcess::nullDevice());
    process.start(QIODevice::ReadOnly);
    if (!process.waitForStarted(kProbeWaitMs))
        return QByteArray();
    if (!process.waitForFinished(kProbeWaitMs)) {
        process.kill();
        process.waitForFinished(kProbeWaitMs);
    }
    return process.readAllStandardOutput();
}

// A new link or copy of the registry under the backup name; the registry itself is untouched.
bool makeBackup(const QString& inRegistry, const QString& inBackup)
{
    const QString target = QFileInfo(inRegistry).canonicalFilePath();
    if (target.isEmpty())
        return false;
    if (::link(QFile::encodeName(target).constData(), QFile::encodeName(inBackup).constData()) == 0)
        return true;
    return QFile::copy(target, inBackup);
}

// Replaces the OtherVersion lines of the registry file with inEntries. The new file is written
// beside the old one and renamed over it only when every byte got written, so the registry is
// either the old or the new one, never a broken one; the old one stays as the backup.
void rewriteOtherVersionLines(const std::vector<Entry>& inEntries)
{
    RkLogFile& log = getTheLogInstance();
    const std::string& pathText = PnResource::registryFilePath().str();
    const QString path = decode(pathText);
    // Said before the first thing that happens (once on every way through); an update that
    // changes nothing is quiet.
    const auto announce = [&]() {
        log.printf("Updating OtherVersion info in PernelRegistry.");
    };

    QFile file(path);
    QByteArray old;
    bool readable = file.open(QIODevice::ReadOnly);
    if (readable) {
        old = file.readAll();
        readable = file.error() == QFileDevice::NoError;
        file.close();
    }
    if (!readable) {
        announce();
        log.warnf("Could not open %s for reading.", pathText.c_str());
        return;
    }

    QList<QByteArray> lines = old.split('\n');
    for (QByteArray& line : lines) {
        if (line.endsWith('\r'))
            line.chop(1);
    }
    for (int i = lines.size() - 1; i >= 0; --i) {
        if (lines[i].trimmed().startsWith(kOtherVersion))
            lines.removeAt(i);
    }
    while (!lines.isEmpty() && lines.last().trimmed().isEmpty())
        lines.removeLast();
    QByteArray content;
    for (int i = 0; i + 1 < lines.size(); ++i)
        content += lines[i] + '\n';
    int number = 0;
    for (const Entry& entry : inEntries)
        content += "    OtherVersion" + QByteArray::number(++number) + ' ' +
                   QByteArray::fromStdString(entry.text) + '\n';
    content += "}\n";
    // Never write what the reader would refuse (say, a block opened by a line that starts
    // with "OtherVersion").
    if (lines.size() < 2 || lines.last().simplified() != "}" ||
        !VelmarMesh::parse(content.toStdString(), pathText.c_str(), nullptr)) {
        announce();
        log.warnf("PernelRegistry has unexpected format, can't update.");
        return;
    }

    // The bundle in memory still holds the old entries after an update; a second call must not
    // pile up backups of an unchanged file.
    if (content == old)
        return;
    announce();

    QString backup = path + QLatin1String(".bak");
    for (int n = 2; QFileInfo::exists(backup) || QFileInfo(backup).isSymLink(); ++n)
        backup = path + QLatin1String(".bak") + QString::number(n);
    if (!makeBackup(path, backup)) {
        log.warnf("Failed to create backup copy of PernelRegistry, can't update.");
        return;
    }
    QSaveFile out(path);
    // Unbuffered: QSaveFile misses errors of the buffer flush in commit() and would rename a
    // truncated file into place.
    if (!out.open(QIODevice::WriteOnly | QIODevice::Unbuffered)) {
        log.warnf("Failed to open PernelRegistry for writing, can't update.");
        QFile::remove(backup);
        return;
    }
    if (out.write(content) != content.size())
        out.cancelWriting();
    if (!out.commit()) {
        log.warnf("Failed to write PernelRegistry, can't update.");
        QFile::remove(backup);
    }
}

// Creates the missing folders of inPath, each with mode 0700.
bool makePrivatePath(const QString& inPath)
{
    if (QFileInfo(inPath).isDir())
        return true;
    const QString parent = QFileInfo(inPath).absolutePath();
    if (parent != inPath && !makePrivatePath(parent))
        return false;
    return ::mkdir(QFile::encodeName(inPath).constData(), 0700) == 0 || errno == EEXIST;
}

} // namespace

namespace PnResource {

QString rootPath()
{
    return QString::fromLocal8Bit(getRoot());
}

VersionProbe parseVersionOutput(const QByteArray& inOutput)
{
    VersionProbe probe;
    // The name, one separator, then the number; a match at the very start does not count.
    const int match = inOutput.indexOf("Protocol Version");
    if (match > 0) {
        const int start = match + 17;
        int end = start;
        while (end < inOutput.size() && (isDigit(inOutput[end]) || inOutput[end] == '.'))
            ++end;
        if (start < end)
            probe.protocolVersion = inOutput.mid(start, end - start);
    }
    const int close = inOutput.indexOf(')');
    if (close >= 0) {
        QByteArray text = inOutput.left(close + 1);
        // Only the line that holds the ")": the text goes into a one-line registry comment.
        text.remove(0, std::max(text.lastIndexOf('\n'), text.lastIndexOf('\r')) + 1);
        if (text.startsWith("Version "))
            text.remove(0, 8);
        if (isStorableText(text))
            probe.versionText = text;
    }
    return probe;
}

bool readRegistry()
{
    const RkFilename& path = registryFilePath();
    RkResult reason;
    const std::unique_ptr<VelmarMesh> mesh = VelmarMesh::read(path.c_str(), &reason);
    RkLogFile& log = getTheLogInstance();
    log.printf("PnResource::readRegistry( \"%s\" ) [%s]", path.c_str(), mesh ? "success" : "fail");
    if (!mesh) {
        for (const RkResult::Record& record : reason.records())
            log.warnf("%s", record.message.c_str());
        return false;
    }
    readFromBundle(*mesh);
    return true;
}

void updateFolders(const char* inFolder)
{
    QString folder = QFile::decodeName(inFolder && *inFolder ? inFolder : ".");
    if (!QFileInfo(folder + QLatin1String("/share")).isDir())
        folder = QDir::cleanPath(QFileInfo(folder).absoluteFilePath() + QLatin1String("/../.."));
    const QFileInfo info(folder);
    QString canonical = info.canonicalFilePath();
    if (canonical.isEmpty())
        canonical = QDir::cleanPath(info.absoluteFilePath());
    setApplicationFolder(QFile::encodeName(canonical).constData());
}

void initialize(const char* const inApplicationFolder, const char* const inRegistryFile)
{
    updateFolders(inApplicationFolder);

    // An empty variable counts as unset: it would name the root folder itself.
    const char* fromEnvironment = std::getenv("PERNEL_REGISTRY");
    RkFilename path(fromEnvironment && *fromEnvironment ? fromEnvironment
                    : inRegistryFile                    ? inRegistryFile
                                                        : "share/dicom/PernelRegistry");
    if (path.isRelative()) {
        path = RkFilename(RkString(getRoot()) + "/" + path);
        // A client started by the client executable shares the server's registry.
        if (PnClientConfig::sStartedViaTzClient)
            path.replaceSubStr("tzclient", "tzserver");
    }
    registryFilePathSet(path.c_str());

    setWebServiceEnabled(false);
    setWebServiceHost("localhost");
    setWebServiceLoginName(getUserName());

    RkFilename local(getRoot());
    local.appendFile(defaultLocalDirName);
    setLocalDirectoryNonExplicit(local.c_str());
    setVolumeDirectory(getLocalDirectory());

    clearRegistryBundle();
    if (!readRegistry())
        handleError(
            RkString(0, "Couldn't read registry file %s.\nUsing default settings.", path.c_str())
                .c_str());
    handleError(checkDirectories());
}

std::string probePathToExecutable(const std::string& inFolder, const std::string& inName,
                                  const char* inNotFoundMessage)
{
    const QString folder = decode(inFolder);
    const QString file = decode(inName) + QLatin1String(".exe");
    QString candidate;
    for (const char* sub : {"/bin/arch-Win/", "/bin/arch-Win64VC9-Optimize/", "/"}) {
        candidate = folder + QLatin1String(sub) + file;
        if (QFileInfo::exists(candidate))
            return encode(candidate);
    }
    if (inNotFoundMessage) {
        // Replaced as text, not formatted: folder names may hold '%'.
        const std::string message = QString::fromLocal8Bit(inNotFoundMessage)
                                        .replace(QLatin1String("%1"), candidate)
                                        .toLocal8Bit()
                                        .toStdString();
        getTheLogInstance().warnf("%s", message.c_str());
    }
    return std::string();
}

void getOtherVersions(std::map<RkVersion, std::string>& outVersions,
                      const RkVersion& inOwnProtocolVersion)
{
    RkLogFile& log = getTheLogInstance();
    std::vector<Entry> entries;
    bool rewrite = false;
    const DvParamBundle& bundle = registryBundle();
    for (int i = 0; i < bundle.size(); ++i) {
        const auto* parameter = dynamic_cast<const DvParameter*>(bundle[i]);
        if (!parameter ||
            parameter->getName().str().compare(0, kOtherVersionLength, kOtherVersion) != 0)
            continue;

        const std::string& value = parameter->getString().str();
        std::string protocol = "0.0.0.0";
        std::string folder = value;
        const std::size_t blank = value.find(' ');
        if (!value.empty() && isDigit(value[0]) && blank != std::string::npos) {
            protocol = value.substr(0, blank);
            folder = value.substr(blank + 1);
        }

        if (!QFileInfo(decode(folder)).isDir()) {
            log.warnf("Other version folder %s not found.", folder.c_str());
            rewrite = true;
            continue;
        }
        const std::string executable =
            probePathToExecutable(folder, "tzserver", "Other version executable %1 not found.");
        if (executable.empty()) {
            rewrite = true;
            continue;
        }

        // Protocol versions 1 to 4 predate the version probe; the registry is trusted for them.
        const int major = leadingInteger(protocol);
        QByteArray versionText;
        if (major < 1 || major > 4) {
            const VersionProbe probe = parseVersionOutput(runVersionProbe(executable));
            const std::string found = probe.protocolVersion.toStdString();
            if (found.empty()) {
                log.errorf("Could not determine protocol version for %s.", folder.c_str());
                if (major == 0) {
                    rewrite = true;
                    continue;
                }
            } else if (RkVersion(found) != RkVersion(protocol)) {
                if (major != 0)
                    log.warnf("Incorrect protocol version %s in PernelRegistry, should be %s.",
                              protocol.c_str(), found.c_str());
                protocol = found;
                rewrite = true;
            }
            versionText = probe.versionText;
        }

        const RkVersion version(protocol);
        if (version == inOwnProtocolVersion) {
            log.warnf("%s has same protocol version %s as this instance, ignoring.", folder.c_str(),
                      protocol.c_str());
            rewrite = true;
            continue;
        }
        // A double quote would end the quoted entry early; such a folder cannot be kept.
        const QByteArray quoted = QByteArray::fromStdString(protocol + ' ' + folder);
        if (quoted.contains('"') || !isStorableText(quoted)) {
            log.warnf("Other version folder %s cannot be stored in PernelRegistry, ignoring.",
                      folder.c_str());
            rewrite = true;
            continue;
        }
        const auto earlier = std::find_if(entries.begin(), entries.end(),
                                          [&](const Entry& e) { return e.version == version; });
        if (earlier != entries.end()) {
            log.warnf("Protocol version %s already defined, ignoring previous entry.",
                      protocol.c_str());
            entries.erase(earlier);
            rewrite = true;
        }
        entries.push_back(
            {version, '"' + quoted.toStdString() + "\" # " + versionText.toStdString()});
        outVersions[version] = folder;
    }
    if (rewrite)
        rewriteOtherVersionLines(entries);
}

const char* getAppDataAbsPath(const char* inFallback)
{
    static RkFilename sPath;
    if (sPath.isEmpty()) {
        // Qt's mapping of the user's application-data folder: $XDG_DATA_HOME or ~/.local/share.
        const QString data = QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation);
        std::string path;
        if (!data.isEmpty() && makePrivatePath(data))
            path = encode(data);
        else
            path = inFallback ? inFallback : "";
        if (!path.empty() && path.back() != '/' && path.back() != '\\')
            path += '/';
        path += std::string(getOrganizationName()) + '/' + getApplicationTesselLocalName();
        sPath = RkFilename(path);
        sPath.fixSlashes();
    }
    return sPath.c_str();
}

RkString getProcessStartupDirectory()
{
    if (!processStartupDirectory().isEmpty())
        return processStartupDirectory();
    ZuPlatform::Handle process = ZuPlatform::kInvalidHandle;
    std::string executable;
    if (ZuPlatform::openProcess(ZuPlatform::currentProcessId(), false, process) != 0)
        return RkString();
    const int error = ZuPlatform::processImageFileName(process, executable);
    ZuPlatform::closeHandle(process);
    if (error != 0 || executable.empty())
        return RkString();
    RkString directory;
    RkFilename::dirname(executable.c_str(), directory);
    processStartupDirectorySet(directory.c_str());
    return directory;
}

QSettings& applicationSettings()
{
    static QSettings sSettings(QSettings::NativeFormat, QSettings::UserScope,
                               QString::fromLocal8Bit(getOrganizationName()),
                               QString::fromLocal8Bit(getApplicationRegistryName()));
    return sSettings;
}

} // namespace PnResource
