#include "zubase/Hardware.h"

#include "zubase/Hardware_p.h"
#include "zubase/ZuCheck_p.h"
#include "zubase/platform/Drives.h"

#include <QCoreApplication>
#include <QFileInfo>
#include <QList>
#include <QProcess>

namespace {

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
    enum class Section
    {
        Between,
        Bios,
        System,
        Other
    };
    QByteArray product = ioProductName.toLatin1();
    QByteArray serial = ioSerialNumber.toLatin1();
    QByteArray bios = ioBios.toLatin1();
    Section section = Section::Between;
    const QList<QByteArray> lines = inOutput.split('\n');
    for (const QByteArray& rawLine : lines) {
        const QByteArray line = rawLine.trimmed();
        switch (section) {
        case Section::Between:
            if (line.startsWith("BIOS Information"))
                section = Section::Bios;
            else if (line.startsWith("System Information"))
                section = Section::System;
            else
                section = Section::Other;
            break;
        case Section::Bios:
            if (line.isEmpty())
                section = Section::Between;
            else if (line.startsWith("Vendor:"))
                bios = lineValue(line);
            else if (line.startsWith("Version:"))
                bios += ", " + lineValue(line);
            else if (line.startsWith("Release Date:"))
                bios += ", " + lineValue(line);
            break;
        case Section::System:
            if (line.isEmpty())
                section = Section::Between;
            else if (line.startsWith("Product Name:"))
                product = lineValue(line);
            else if (line.startsWith("Serial Number:"))
                serial = lineValue(line);
            break;
        case Section::Other:
            if (line.isEmpty())
                section = Section::Between;
            break;
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
    if (!process.waitForStarted(5000))
        return;
    if (!process.waitForFinished(10000)) {
        process.kill();
        process.waitForFinished(1000);
        return;
    }
    parseDmiDecodeOutput(process.readAllStandardOutput(), outProductName, outSerialNumber, outBios);
}

RkResult getDiskFreeSpaceMB(const QString& inPath, unsigned int& outFreeMB, float& outUsedPercent)
{
    RkResult res;
    outFreeMB = 0;
    outUsedPercent = 0;
    std::uint64_t freeBytes = 0;
    std::uint64_t totalBytes = 0;
    const int error = ZuPlatform::drivesFreeSpace(Q2M(inPath).toStdString(), freeBytes, totalBytes);
    const bool ret = error == 0;
    if (Tz::failWin(RK_CHECK(ret, "ret", QStringLiteral("::GetDiskFreeSpaceEx() [%1]").arg(inPath)),
                    error)) {
        res.makeBad(1);
        return res;
    }
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
