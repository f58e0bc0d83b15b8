// Text utilities benchmark: the cipher against a plain chained-XOR loop and the HTML table
// against a bare QXmlStreamWriter writing the same elements, each measured in the same run.
#include "zubase/SimpleCrypt.h"
#include "zubase/ZuHtmlTable.h"

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QRandomGenerator>
#include <QXmlStreamWriter>

#include <cstdio>
#include <functional>

namespace {

// Best of several runs, in milliseconds; the best run is the one least disturbed by others.
double bestOf(int inRuns, const std::function<void()>& inWork)
{
    double best = 1e300;
    for (int run = 0; run < inRuns; ++run) {
        QElapsedTimer timer;
        timer.start();
        inWork();
        best = std::min(best, timer.nsecsElapsed() / 1e6);
    }
    return best;
}

volatile int sSink = 0; // keeps results alive

void benchCipher()
{
    const int size = 64 * 1024 * 1024;
    QByteArray data(size, Qt::Uninitialized);
    QRandomGenerator generator(1);
    generator.fillRange(reinterpret_cast<quint32*>(data.data()), size / 4);
    const quint64 key = Q_UINT64_C(0x0c2ad4a4acb9f023);
    uchar keyBytes[8];
    for (int i = 0; i < 8; ++i)
        keyBytes[i] = uchar(key >> (8 * i));

    // The baseline: the same chained XOR into a fresh array, as plainly as it can be written.
    const auto plainLoop = [&] {
        QByteArray out(size, Qt::Uninitialized);
        const auto* in = reinterpret_cast<const uchar*>(data.constData());
        auto* o = reinterpret_cast<uchar*>(out.data());
        uchar last = 0;
        for (int p = 0; p < size; ++p) {
            last = in[p] ^ keyBytes[p % 8] ^ last;
            o[p] = last;
        }
        sSink = sSink + o[size - 1];
    };

    SimpleCrypt crypt(key);
    crypt.setCompressionMode(SimpleCrypt::CompressNever);
    crypt.setIntegrityProtectionMode(SimpleCrypt::IntegrityNone);
    QByteArray frame;
    const auto encryptRun = [&] {
        frame = crypt.encryptToByteArray(data);
        sSink = sSink + frame.at(frame.size() - 1);
    };
    const auto decryptRun = [&] {
        const QByteArray back = crypt.decryptToByteArray(frame);
        sSink = sSink + back.at(back.size() - 1);
    };
    // Interleaved, so that load from elsewhere on the machine hits all sides alike.
    double plain = 1e300;
    double encrypt = 1e300;
    double decrypt = 1e300;
    for (int run = 0; run < 9; ++run) {
        plain = std::min(plain, bestOf(1, plainLoop));
        encrypt = std::min(encrypt, bestOf(1, encryptRun));
        decrypt = std::min(decrypt, bestOf(1, decryptRun));
    }
    if (crypt.decryptToByteArray(frame) != data)
        std::printf("ERROR: cipher round trip failed\n");

    const double mib = size / (1024.0 * 1024.0);
    std::printf("cipher 64 MiB: plain XOR loop %.1f ms (%.0f MiB/s), encrypt %.1f ms (%.0f MiB/s), "
                "decrypt %.1f ms (%.0f MiB/s)\n",
                plain, mib / plain * 1000, encrypt, mib / encrypt * 1000, decrypt,
                mib / decrypt * 1000);
    std::printf("RATIO cipher encrypt throughput / plain loop: %.2f (goal >= 0.8)\n",
                plain / encrypt);
    std::printf("      cipher decrypt throughput / plain loop: %.2f\n", plain / decrypt);
}

void benchHtml()
{
    const int rows = 10000;
    const int columns = 8;
    QVector<QStringList> texts;
    for (int r = 0; r < rows; ++r) {
        QStringList row;
        for (int c = 0; c < columns; ++c)
            row << QStringLiteral("cell %1/%2").arg(r).arg(c);
        texts << row;
    }
    QStringList header;
    for (int c = 0; c < columns; ++c)
        header << QStringLiteral("Column %1").arg(c);

    ZuHtmlTable table;
    table.setHeader(header);
    for (const QStringList& row : texts)
        table.addRow(row);
    table.setAttribute(ZuHtmlTable::TableBorder, 1);
    table.setDefaultColumnAlignment(1, ZuHtmlTable::AlignRight);

    QString html;
    const auto ours = [&] {
        html = table.createHtml();
        sSink = sSink + html.size();
    };

    // The same elements and attributes through a bare writer.
    QString bare;
    const auto baseline = [&] {
        bare.clear();
        QXmlStreamWriter writer(&bare);
        writer.writeStartDocument();
        writer.writeStartElement(QStringLiteral("table"));
        writer.writeAttribute(QStringLiteral("border"), QStringLiteral("1"));
        writer.writeStartElement(QStringLiteral("tr"));
        for (const QString& text : header) {
            writer.writeStartElement(QStringLiteral("th"));
            writer.writeCharacters(text);
            writer.writeEndElement();
        }
        writer.writeEndElement();
        for (const QStringList& row : texts) {
            writer.writeStartElement(QStringLiteral("tr"));
            for (int c = 0; c < row.size(); ++c) {
                writer.writeStartElement(QStringLiteral("td"));
                if (c == 1)
                    writer.writeAttribute(QStringLiteral("align"), QStringLiteral("right"));
                writer.writeCharacters(row[c]);
                writer.writeEndElement();
            }
            writer.writeEndElement();
        }
        writer.writeEndElement();
        writer.writeEndDocument();
        sSink = sSink + bare.size();
    };
    // Interleaved, so that load from elsewhere on the machine hits both sides alike.
    double oursMs = 1e300;
    double baselineMs = 1e300;
    for (int run = 0; run < 15; ++run) {
        oursMs = std::min(oursMs, bestOf(1, ours));
        baselineMs = std::min(baselineMs, bestOf(1, baseline));
    }
    if (html != bare)
        std::printf("ERROR: the two HTML texts differ\n");

    std::printf("html 10000 x 8: createHtml %.1f ms, bare QXmlStreamWriter %.1f ms\n", oursMs,
                baselineMs);
    std::printf("RATIO createHtml time / bare writer: %.2f (goal <= 1.5)\n", oursMs / baselineMs);
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    benchCipher();
    benchHtml();
    return 0;
}
