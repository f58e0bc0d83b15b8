#include "zubase/Hardware.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/platform/SysDrives.h"
#include "zubase/system/Hardware_p.h"

#include <QCoreApplication>
#include <QFileInfo>
#include <QList>
#include <QProcess>

#include <vector>

namespace {

constexpr int kStartTimeout = 5000;
constexpr int kFinishTimeout = 10000;
constexpr int kKillTimeout = 1000;

// The text after the first ':' and the blank that follows it.
QByteArray lineValue(const QByteArray& inLine)
{
    const int colon = inLine.indexOf(':');
    if (colon <= 0)
        return QByteArray();
    return inLine.mid(colon + 2);
}

QString findDmiTool()
{
    const QString dir = QCoreApplication::applicationDirPath();
    for (const char* name : {"dmidecode.exe", "dmidecode"}) {
        const QFileInfo tool(dir + QLatin1Char('/') + QLatin1String(name));
        if (tool.isFile() && tool.isExecutable())
            return tool.absoluteFilePath();
    }
    return QString();
}

} // namespace

namespace ZuBase {

void parseDmiDecodeOutput(const QByteArray& inOutput, QString& ioProductName,
                          QString& ioSerialNumber, QString& ioBios)
{
    QByteArray product = ioProductName.toLatin1();
    QByteArray serial = ioSerialNumber.toLatin1();
    QByteArray bios = ioBios.toLatin1();
    // The section table: the lines read in each section; the first key a line starts with wins.
    struct Field
    {
        const char* key;
        QByteArray* value;
        bool append; // after ", ", else replacing the value
    };
    const std::vector<Field> biosFields{
        {"Vendor:", &bios, false}, {"Version:", &bios, true}, {"Release Date:", &bios, true}};
    const std::vector<Field> systemFields{{"Product Name:", &product, false},
                                          {"Serial Number:", &serial, false}};
    const std::vector<Field> otherFields;
    // Between sections (null) the next line opens one; an empty line ends it.
    const std::vector<Field>* section = nullptr;
    const QList<QByteArray> lines = inOutput.split('\n');
    for (const QByteArray& rawLine : lines) {
        const QByteArray line = rawLine.trimmed();
        if (!section) {
            section = line.startsWith("BIOS Information")     ? &biosFields
                      : line.startsWith("System Information") ? &systemFields
                                                              : &otherFields;
            continue;
        }
        if (line.isEmpty()) {
            section = nullptr;
            continue;
        }
        for (const Field& field : *section) {
            if (line.startsWith(field.key)) {
                *field.value =
                    field.append ? *field.value + ", " + lineValue(line) : lineValue(line);
                break;
            }
        }
    }
    ioProductName = QString::fromLatin1(product);
    ioSerialNumber = QString::fromLatin1(serial);
    ioBios = QString::fromLatin1(bios);
}

void getHardwareType(QString& outProductName, QString& outSerialNumber, QString& outBios)
{
    outProductName = QStringLiteral("N/A");
    outSerialNumber = QStringLiteral("N/A");
    outBios = QStringLiteral("N/A");

    const QString tool = findDmiTool();
    if (tool.isEmpty())
        return;
    // Program and arguments apart: the application directory may contain blanks.
    QProcess process;
    process.start(tool, QStringList() << QStringLiteral("-q"), QIODevice::ReadWrite);
    if (!process.waitForStarted(kStartTimeout))
        return;
    // A tool that has not finished in time still gives what it has printed so far.
    process.waitForFinished(kFinishTimeout);
    const QByteArray output = process.readAllStandardOutput();
    // Ended here, so that the QProcess destructor has no running process to warn about.
    if (process.state() != QProcess::NotRunning) {
        process.kill();
        process.waitForFinished(kKillTimeout);
    }
    parseDmiDecodeOutput(output, outProductName, outSerialNumber, outBios);
}

RkResult getDiskFreeSpaceMB(const QString& inPath, unsigned int& outFreeMB, float& outUsedPercent)
{
    RkResult res;
    outFreeMB = 0;
    outUsedPercent = 0;
    std::uint64_t freeBytes = 0;
    std::uint64_t totalBytes = 0;
    const int error = ZuPlatform::drivesFreeSpace(Q2M(inPath).toStdString(), freeBytes, totalBytes);
    const bool measured = error == 0; // recorded as "ret"
    ZU_CHECK_WIN_RETURN(
        res, RK_CHECK(measured, "ret", QStringLiteral("::GetDiskFreeSpaceEx() [%1]").arg(inPath)),
        error);
    diskSpaceFromBytes(freeBytes, totalBytes, outFreeMB, outUsedPercent);
    return res;
}

void diskSpaceFromBytes(quint64 inFreeBytes, quint64 inTotalBytes, unsigned int& outFreeMB,
                        float& outUsedPercent)
{
    outUsedPercent =
        static_cast<float>((static_cast<double>(inTotalBytes) - static_cast<double>(inFreeBytes)) *
                           100.0 / (static_cast<double>(inTotalBytes) + 1.0));
    outFreeMB = static_cast<unsigned int>(inFreeBytes >> 20);
}

} // namespace ZuBase
