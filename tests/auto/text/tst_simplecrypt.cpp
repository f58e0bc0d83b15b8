// String cipher: every mode checked against an implementation of the frame written here from
// scratch (zlib, a bitwise CRC), tampering, errors and hostile input.
#include "zubase/SimpleCrypt.h"

#include <QCryptographicHash>
#include <QRandomGenerator>
#include <QtTest>

#include <zlib.h>

#ifdef Q_OS_LINUX
#include <sys/resource.h>
#include <unistd.h>
#endif

Q_DECLARE_METATYPE(SimpleCrypt::CompressionMode)
Q_DECLARE_METATYPE(SimpleCrypt::IntegrityProtectionMode)
Q_DECLARE_METATYPE(SimpleCrypt::Error)

namespace ref {

QByteArray bigEndian(quint32 inValue, int inBytes)
{
    return QByteArray::fromHex(QByteArray::number(inValue, 16).rightJustified(2 * inBytes, '0'));
}

// CRC-16/X-25: reflected 0x1021, start 0xFFFF, inverted.
quint16 crc16(const QByteArray& inData)
{
    quint16 crc = 0xFFFF;
    for (const char c : inData) {
        crc ^= uchar(c);
        for (int bit = 0; bit < 8; ++bit)
            crc = (crc & 1) ? quint16((crc >> 1) ^ 0x8408) : quint16(crc >> 1);
    }
    return quint16(~crc);
}

// 4-byte big-endian length, then a zlib stream at level 9 (no stream at all for nothing).
QByteArray compress(const QByteArray& inData)
{
    uLongf size = compressBound(uLong(inData.size()));
    QByteArray out(int(size), '\0');
    compress2(reinterpret_cast<Bytef*>(out.data()), &size,
              reinterpret_cast<const Bytef*>(inData.constData()), uLong(inData.size()), 9);
    return bigEndian(uint(inData.size()), 4) +
           (inData.isEmpty() ? QByteArray() : out.left(int(size)));
}

bool uncompress(const QByteArray& inData, QByteArray& outData)
{
    uLongf size = inData.left(4).toHex().toUInt(nullptr, 16);
    outData = QByteArray(int(size), '\0');
    return inData.size() == 4 ? size == 0
                              : ::uncompress(reinterpret_cast<Bytef*>(outData.data()), &size,
                                             reinterpret_cast<const Bytef*>(inData.constData() + 4),
                                             uLong(inData.size() - 4)) == Z_OK &&
                                    size == uLongf(outData.size());
}

// The chained XOR: each byte is also XOR-ed with the previous encrypted byte.
QByteArray chain(quint64 inKey, const QByteArray& inBlock, bool inDecode)
{
    QByteArray out(inBlock.size(), '\0');
    uchar previous = 0;
    for (int p = 0; p < inBlock.size(); ++p) {
        out[p] = char(uchar(inBlock[p]) ^ uchar(inKey >> (8 * (p % 8))) ^ previous);
        previous = uchar(inDecode ? inBlock[p] : out[p]);
    }
    return out;
}

QByteArray frame(quint64 inKey, char inFlags, const QByteArray& inBlock)
{
    return QByteArray(1, char(0x03)) + inFlags + chain(inKey, inBlock, false);
}

QByteArray encrypt(quint64 inKey, bool inCompress, int inIntegrity, uchar inRandom,
                   const QByteArray& inPlain)
{
    const QByteArray payload = inCompress ? compress(inPlain) : inPlain;
    const QByteArray field = inIntegrity == 1 ? bigEndian(crc16(payload), 2)
                             : inIntegrity == 2
                                 ? QCryptographicHash::hash(payload, QCryptographicHash::Sha1)
                                 : QByteArray();
    const int flags =
        (inCompress ? 0x01 : 0) | (inIntegrity == 1 ? 0x02 : 0) | (inIntegrity == 2 ? 0x04 : 0);
    return frame(inKey, char(flags), char(inRandom) + field + payload);
}

// False for anything that is not a sound frame.
bool decrypt(quint64 inKey, const QByteArray& inFrame, QByteArray& outPlain, uchar& outRandom)
{
    if (inFrame.size() < 3 || inFrame[0] != 0x03)
        return false;
    const char flags = inFrame[1];
    const QByteArray block = chain(inKey, inFrame.mid(2), true);
    outRandom = uchar(block[0]);
    const int fieldSize = (flags & 0x02) ? 2 : (flags & 0x04) ? 20 : 0;
    const QByteArray field = block.mid(1, fieldSize);
    const QByteArray payload = block.mid(1 + fieldSize);
    if (fieldSize &&
        field != (fieldSize == 2 ? bigEndian(crc16(payload), 2)
                                 : QCryptographicHash::hash(payload, QCryptographicHash::Sha1)))
        return false;
    if (flags & 0x01)
        return uncompress(payload, outPlain);
    outPlain = payload;
    return true;
}

} // namespace ref

namespace {

const quint64 kKey = Q_UINT64_C(0x0c2ad4a4acb9f023);
const char* const kVersionWarning = "Invalid version or not a cyphertext.";

QStringList sMessages;

QByteArray randomBytes(QRandomGenerator& ioGenerator, int inSize)
{
    QByteArray bytes(inSize, '\0');
    for (char& c : bytes)
        c = char(ioGenerator.bounded(256));
    return bytes;
}

} // namespace

class TestSimpleCrypt : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void referenceSelfCheck();
    void modes_data();
    void modes();
    void randomByteVaries();
    void badInput_data();
    void badInput();
    void randomInput();
};

// A claimed size must not make the cipher reserve memory: the suite runs with the address space
// capped a little above what the process already uses.
void TestSimpleCrypt::initTestCase()
{
#ifdef Q_OS_LINUX
    QFile statm(QStringLiteral("/proc/self/statm"));
    QVERIFY(statm.open(QIODevice::ReadOnly));
    const qint64 pages = statm.readAll().split(' ').value(0).toLongLong();
    QVERIFY(pages > 0);
    struct rlimit limit;
    QCOMPARE(getrlimit(RLIMIT_AS, &limit), 0);
    limit.rlim_cur = std::min(rlim_t(pages) * rlim_t(sysconf(_SC_PAGESIZE)) + (rlim_t(256) << 20),
                              limit.rlim_cur);
    QCOMPARE(setrlimit(RLIMIT_AS, &limit), 0);
#endif
}

void TestSimpleCrypt::referenceSelfCheck()
{
    // The check value of CRC-16/X-25, and Qt agreeing with it.
    QCOMPARE(ref::crc16("123456789"), quint16(0x906E));
    QCOMPARE(qChecksum("123456789", 9), quint16(0x906E));
    // A frame worked out by hand: key bytes 01..08, random byte 0x55, "hi", no extras.
    const QByteArray handMade = QByteArray::fromHex("0300543e54");
    QCOMPARE(ref::encrypt(Q_UINT64_C(0x0807060504030201), false, 0, 0x55, "hi"), handMade);
    SimpleCrypt crypt(Q_UINT64_C(0x0807060504030201));
    QCOMPARE(crypt.decryptToByteArray(handMade), QByteArray("hi"));
}

void TestSimpleCrypt::modes_data()
{
    QTest::addColumn<SimpleCrypt::CompressionMode>("compression");
    QTest::addColumn<SimpleCrypt::IntegrityProtectionMode>("integrity");
    QTest::addColumn<QByteArray>("plain");
    QRandomGenerator generator(7);
    const QList<QPair<const char*, QByteArray>> inputs = {
        {"empty", QByteArray()},
        {"short", "hi"},
        {"repetitive", QByteArray(10000, 'x') + "end"},
        {"random", randomBytes(generator, 1000)},
        {"text", QStringLiteral("Grüße, 日本 \u00e9\n\0tail").toUtf8()}};
    const char* compressionNames[] = {"auto", "always", "never"};
    const char* integrityNames[] = {"none", "checksum", "hash"};
    for (int c = 0; c < 3; ++c)
        for (int i = 0; i < 3; ++i)
            for (const auto& input : inputs)
                QTest::addRow("%s/%s/%s", compressionNames[c], integrityNames[i], input.first)
                    << SimpleCrypt::CompressionMode(c) << SimpleCrypt::IntegrityProtectionMode(i)
                    << input.second;
}

void TestSimpleCrypt::modes()
{
    QFETCH(SimpleCrypt::CompressionMode, compression);
    QFETCH(SimpleCrypt::IntegrityProtectionMode, integrity);
    QFETCH(QByteArray, plain);
    SimpleCrypt crypt(kKey);
    crypt.setCompressionMode(compression);
    crypt.setIntegrityProtectionMode(integrity);
    const QByteArray frame = crypt.encryptToByteArray(plain);
    QCOMPARE(crypt.lastError(), SimpleCrypt::NoError);

    // Ours -> reference, which rebuilds the very same bytes from the frame's random byte.
    const bool compressed =
        compression == SimpleCrypt::CompressAlways ||
        (compression == SimpleCrypt::CompressAuto && qCompress(plain, 9).size() < plain.size());
    QByteArray decoded;
    uchar random = 0;
    QVERIFY(ref::decrypt(kKey, frame, decoded, random));
    QCOMPARE(decoded, plain);
    QCOMPARE(ref::encrypt(kKey, compressed, int(integrity), random, plain), frame);

    // Reference -> ours, whatever the reader's own modes.
    SimpleCrypt reader(kKey);
    reader.setCompressionMode(SimpleCrypt::CompressNever);
    reader.setIntegrityProtectionMode(SimpleCrypt::IntegrityNone);
    for (const bool compress : {false, true}) {
        const QByteArray foreign =
            ref::encrypt(kKey, compress, int(integrity), compress ? 0 : 0xff, plain);
        QCOMPARE(reader.decryptToByteArray(foreign), plain);
        QCOMPARE(reader.lastError(), SimpleCrypt::NoError);
    }

    // The string forms: the frame in Base64, texts as UTF-8.
    const QString text = QString::fromUtf8(plain);
    const QString cypherText = crypt.encryptToString(text);
    QCOMPARE(reader.decryptToByteArray(QByteArray::fromBase64(cypherText.toLatin1())),
             text.toUtf8());
    QCOMPARE(reader.decryptToString(cypherText), text);
    QCOMPARE(reader.decryptToByteArray(crypt.encryptToString(plain)), plain);
    QCOMPARE(reader.decryptToString(crypt.encryptToByteArray(text)), text);

    if (integrity == SimpleCrypt::IntegrityNone)
        return;
    // Any flipped bit of the block, or a wrong key, is caught; the sound frame reads afterwards.
    for (int p = 2; p < frame.size(); ++p) {
        QByteArray bad = frame;
        bad[p] = char(bad[p] ^ (p % 2 ? 0x01 : 0x80));
        QVERIFY2(reader.decryptToByteArray(bad).isEmpty(), qPrintable(QString::number(p)));
        QCOMPARE(reader.lastError(), SimpleCrypt::IntegrityError);
    }
    SimpleCrypt wrongKey(~kKey);
    QVERIFY(wrongKey.decryptToByteArray(frame).isEmpty());
    QCOMPARE(wrongKey.lastError(), SimpleCrypt::IntegrityError);
    QCOMPARE(reader.decryptToByteArray(frame), plain);
    QCOMPARE(reader.lastError(), SimpleCrypt::NoError);
}

void TestSimpleCrypt::randomByteVaries()
{
    SimpleCrypt crypt(kKey);
    QSet<QByteArray> frames;
    for (int i = 0; i < 32; ++i)
        frames.insert(crypt.encryptToByteArray(QByteArray("same")));
    QVERIFY(frames.size() > 1);
}

void TestSimpleCrypt::badInput_data()
{
    QTest::addColumn<QByteArray>("cypher");
    QTest::addColumn<SimpleCrypt::Error>("error"); // NoKeyError: decrypted without a key
    QTest::addColumn<QByteArray>("expected");
    auto row = [](const char* inName, const QByteArray& inCypher,
                  SimpleCrypt::Error inError = SimpleCrypt::IntegrityError,
                  const QByteArray& inExpected = QByteArray()) {
        QTest::newRow(inName) << inCypher << inError << inExpected;
    };
    // Frames of our own making; the payload follows the random byte.
    auto frame = [](int inFlags, const QByteArray& inPayload) {
        return ref::frame(kKey, char(inFlags), "r" + inPayload);
    };
    auto sized = [](quint32 inSize) {
        return ref::bigEndian(inSize, 4);
    };
    const QByteArray data(100000, 'z');
    const QByteArray stream = ref::compress(data).mid(4);
    const QByteArray half = stream.left(stream.size() / 2);

    row("no key", QByteArray::fromHex("0300543e54"), SimpleCrypt::NoKeyError);
    row("empty", QByteArray(), SimpleCrypt::VersionError);
    row("version 2", QByteArray::fromHex("0200543e54"), SimpleCrypt::VersionError);
    row("version only", QByteArray::fromHex("03"));
    row("no random byte", QByteArray::fromHex("0300"));
    row("checksum flag, 1 byte", frame(0x02, "a"));
    row("hash flag, 19 bytes", frame(0x04, QByteArray(19, 'a')));
    row("all flags, 1 byte", frame(0x07, "x"));
    row("compressed, 3 bytes", frame(0x01, "abc"));
    row("zero size with bytes", frame(0x01, sized(0) + "xyz"));
    row("size without stream", frame(0x01, sized(10)));
    row("garbage stream", frame(0x01, sized(100) + "qqqqqqqq"));
    row("size too small", frame(0x01, sized(99999) + stream));
    row("truncated stream", frame(0x01, sized(100000) + stream.chopped(1)));
    // Huge claims: a reader that trusted them would reserve or fill them and die under the cap.
    row("4 GiB, garbage", frame(0x01, sized(0xFFFFFFFF) + "garbage"));
    row("1 GiB, truncated", frame(0x01, sized(0x40000000) + half));
    // Beyond what a byte array holds: refused; below: inflated as far as the stream reaches.
    row("2 GiB, whole stream", frame(0x01, sized(0x7FFFFFF0) + stream));
    row("1 GiB, whole stream", frame(0x01, sized(0x40000000) + stream), SimpleCrypt::NoError, data);
}

void TestSimpleCrypt::badInput()
{
    QFETCH(QByteArray, cypher);
    QFETCH(SimpleCrypt::Error, error);
    QFETCH(QByteArray, expected);
    SimpleCrypt crypt;
    QVERIFY(!crypt.hasKey());
    if (error != SimpleCrypt::NoKeyError) {
        crypt.setKey(error == SimpleCrypt::VersionError ? 0 : kKey);
        QVERIFY(crypt.hasKey()); // also for the key 0
    }
    // Only the missing key and the version are warned about; randomInput checks the silence.
    const char* warning = error == SimpleCrypt::NoKeyError     ? "No key set."
                          : error == SimpleCrypt::VersionError ? kVersionWarning
                                                               : nullptr;
    for (const bool base64 : {false, true}) {
        if (warning)
            QTest::ignoreMessage(QtWarningMsg, warning);
        QCOMPARE(base64 ? crypt.decryptToByteArray(QString::fromLatin1(cypher.toBase64()))
                        : crypt.decryptToByteArray(cypher),
                 expected);
        QCOMPARE(crypt.lastError(), error);
    }
    if (error == SimpleCrypt::NoKeyError) {
        QTest::ignoreMessage(QtWarningMsg, warning);
        QVERIFY(crypt.encryptToByteArray(QByteArray("x")).isEmpty());
        QCOMPARE(crypt.lastError(), SimpleCrypt::NoKeyError);
    }
}

// Nothing crashes, every failure comes back empty, and no warning but the version's is written.
void TestSimpleCrypt::randomInput()
{
    QRandomGenerator generator(20240305);
    SimpleCrypt crypt(kKey);
    const QByteArray good = ref::encrypt(kKey, true, 1, 9, QByteArray(300, 'g'));
    QStringList bad;
    sMessages.clear();
    const QtMessageHandler previous = qInstallMessageHandler(
        [](QtMsgType, const QMessageLogContext&, const QString& inText) { sMessages << inText; });
    for (int round = 0; round < 20000; ++round) {
        QByteArray cypher;
        switch (round % 3) {
        case 0: // anything behind a right version byte
            cypher = char(0x03) + randomBytes(generator, int(generator.bounded(80)));
            break;
        case 1: // a sound frame, cut and with one byte changed
            cypher = good.left(int(generator.bounded(good.size() + 1)));
            if (cypher.size() > 1)
                cypher[int(generator.bounded(1, cypher.size()))] = char(generator.bounded(256));
            break;
        default: // random compressed payloads, as if the integrity field had passed
            cypher = ref::frame(kKey, 0x01, randomBytes(generator, 1 + int(generator.bounded(40))));
            break;
        }
        const QByteArray result = crypt.decryptToByteArray(cypher);
        const SimpleCrypt::Error error = crypt.lastError();
        if (cypher.startsWith(char(0x03)) != (error != SimpleCrypt::VersionError) ||
            (error != SimpleCrypt::NoError && !result.isEmpty()) ||
            error == SimpleCrypt::NoKeyError)
            bad << QString::fromLatin1(cypher.toHex());
    }
    qInstallMessageHandler(previous);
    QCOMPARE(bad, QStringList());
    sMessages.removeAll(QString::fromLatin1(kVersionWarning));
    QCOMPARE(sMessages, QStringList());
}

QTEST_GUILESS_MAIN(TestSimpleCrypt)
#include "tst_simplecrypt.moc"
