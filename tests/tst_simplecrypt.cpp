// String cipher: round trips in every mode, the frame checked against an implementation of the
// byte layout written here from scratch (zlib, a bitwise CRC), tampering, and hostile input.
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

// CRC-16 as ISO 3309 / X.25 defines it (reflected 0x1021, start 0xFFFF, inverted).
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

QByteArray sha1(const QByteArray& inData)
{
    return QCryptographicHash::hash(inData, QCryptographicHash::Sha1);
}

// 4-byte big-endian length, then a zlib stream at level 9.
QByteArray compress(const QByteArray& inData)
{
    if (inData.isEmpty())
        return QByteArray(4, '\0'); // no stream at all for nothing
    uLongf size = compressBound(uLong(inData.size()));
    QByteArray out(int(size) + 4, '\0');
    const uint n = uint(inData.size());
    out[0] = char(n >> 24);
    out[1] = char(n >> 16);
    out[2] = char(n >> 8);
    out[3] = char(n);
    if (compress2(reinterpret_cast<Bytef*>(out.data() + 4), &size,
                  reinterpret_cast<const Bytef*>(inData.constData()), uLong(inData.size()),
                  9) != Z_OK)
        return QByteArray();
    out.resize(int(size) + 4);
    return out;
}

bool uncompress(const QByteArray& inData, QByteArray& outData)
{
    if (inData.size() < 4)
        return false;
    uLongf size = (uLong(uchar(inData[0])) << 24) | (uLong(uchar(inData[1])) << 16) |
                  (uLong(uchar(inData[2])) << 8) | uLong(uchar(inData[3]));
    outData = QByteArray(int(size), '\0');
    if (inData.size() == 4)
        return size == 0;
    return ::uncompress(reinterpret_cast<Bytef*>(outData.data()), &size,
                        reinterpret_cast<const Bytef*>(inData.constData() + 4),
                        uLong(inData.size() - 4)) == Z_OK &&
           size == uLongf(outData.size());
}

// The frame around any block content: version, flags, then the chained XOR.
QByteArray frame(quint64 inKey, char inFlags, const QByteArray& inBlock)
{
    QByteArray out;
    out.append(char(0x03));
    out.append(inFlags);
    uchar last = 0;
    for (int p = 0; p < inBlock.size(); ++p) {
        const uchar keyByte = uchar(inKey >> (8 * (p % 8)));
        last = uchar(inBlock[p]) ^ keyByte ^ last;
        out.append(char(last));
    }
    return out;
}

QByteArray encrypt(quint64 inKey, bool inCompress, int inIntegrity, uchar inRandom,
                   const QByteArray& inPlain)
{
    QByteArray payload = inCompress ? compress(inPlain) : inPlain;
    char flags = inCompress ? 0x01 : 0x00;
    QByteArray block(1, char(inRandom));
    if (inIntegrity == 1) {
        flags |= 0x02;
        const quint16 crc = crc16(payload);
        block.append(char(crc >> 8)).append(char(crc & 0xFF));
    } else if (inIntegrity == 2) {
        flags |= 0x04;
        block.append(sha1(payload));
    }
    return frame(inKey, flags, block + payload);
}

// False for anything that is not a sound frame.
bool decrypt(quint64 inKey, const QByteArray& inFrame, QByteArray& outPlain, uchar* outRandom)
{
    if (inFrame.size() < 3 || inFrame[0] != 0x03)
        return false;
    const char flags = inFrame[1];
    QByteArray block;
    uchar previous = 0;
    for (int p = 2; p < inFrame.size(); ++p) {
        const uchar in = uchar(inFrame[p]);
        block.append(char(in ^ uchar(inKey >> (8 * ((p - 2) % 8))) ^ previous));
        previous = in;
    }
    if (outRandom)
        *outRandom = uchar(block[0]);
    block.remove(0, 1);
    if (flags & 0x02) {
        if (block.size() < 2)
            return false;
        const quint16 crc = quint16((uchar(block[0]) << 8) | uchar(block[1]));
        block.remove(0, 2);
        if (crc != crc16(block))
            return false;
    } else if (flags & 0x04) {
        if (block.size() < 20 || block.left(20) != sha1(block.mid(20)))
            return false;
        block.remove(0, 20);
    }
    if (flags & 0x01)
        return uncompress(block, outPlain);
    outPlain = block;
    return true;
}

} // namespace ref

namespace {

const quint64 kKey = Q_UINT64_C(0x0c2ad4a4acb9f023);

QStringList sWarnings;

void collectMessages(QtMsgType, const QMessageLogContext&, const QString& inText)
{
    sWarnings << inText;
}

QByteArray randomBytes(QRandomGenerator& ioGenerator, int inSize)
{
    QByteArray bytes(inSize, '\0');
    for (char& c : bytes)
        c = char(ioGenerator.bounded(256));
    return bytes;
}

QByteArray sampleInput(const QString& inName)
{
    QRandomGenerator generator(7);
    if (inName == QLatin1String("empty"))
        return QByteArray();
    if (inName == QLatin1String("short"))
        return QByteArrayLiteral("hi");
    if (inName == QLatin1String("repetitive"))
        return QByteArray(10000, 'x') + "end";
    if (inName == QLatin1String("random"))
        return randomBytes(generator, 1000);
    return QStringLiteral("Grüße, 日本 \u00e9\n\0tail").toUtf8();
}

const char* const kInputs[] = {"empty", "short", "repetitive", "random", "text"};

void addModeRows()
{
    QTest::addColumn<SimpleCrypt::CompressionMode>("compression");
    QTest::addColumn<SimpleCrypt::IntegrityProtectionMode>("integrity");
    QTest::addColumn<QString>("input");
    const char* compressionNames[] = {"auto", "always", "never"};
    const char* integrityNames[] = {"none", "checksum", "hash"};
    for (int c = 0; c < 3; ++c)
        for (int i = 0; i < 3; ++i)
            for (const char* input : kInputs)
                QTest::addRow("%s/%s/%s", compressionNames[c], integrityNames[i], input)
                    << SimpleCrypt::CompressionMode(c) << SimpleCrypt::IntegrityProtectionMode(i)
                    << QString::fromLatin1(input);
}

} // namespace

class TestSimpleCrypt : public QObject
{
    Q_OBJECT

private slots:
    void referenceSelfCheck();
    void roundTrip_data();
    void roundTrip();
    void framesMatchReference_data();
    void framesMatchReference();
    void randomByteVaries();
    void tamperedFramesFail_data();
    void tamperedFramesFail();
    void wrongKey();
    void errors_data();
    void errors();
    void hostileFrames_data();
    void hostileFrames();
    void randomInputNeverCrashes();
    void hostileFramesStayBounded();
};

void TestSimpleCrypt::referenceSelfCheck()
{
    // The published check value of CRC-16/X-25, and Qt agreeing with it.
    QCOMPARE(ref::crc16("123456789"), quint16(0x906E));
    QCOMPARE(qChecksum("123456789", 9), quint16(0x906E));

    // A frame worked out by hand: key bytes 01..08, random byte 0x55, "hi", no extras.
    SimpleCrypt crypt(Q_UINT64_C(0x0807060504030201));
    const QByteArray handMade = QByteArray::fromHex("0300543e54");
    QCOMPARE(crypt.decryptToByteArray(handMade), QByteArray("hi"));
    QCOMPARE(crypt.lastError(), SimpleCrypt::NoError);
    QCOMPARE(ref::encrypt(Q_UINT64_C(0x0807060504030201), false, 0, 0x55, "hi"), handMade);
}

void TestSimpleCrypt::roundTrip_data()
{
    addModeRows();
}

void TestSimpleCrypt::roundTrip()
{
    QFETCH(SimpleCrypt::CompressionMode, compression);
    QFETCH(SimpleCrypt::IntegrityProtectionMode, integrity);
    QFETCH(QString, input);
    const QByteArray plain = sampleInput(input);

    SimpleCrypt crypt(kKey);
    crypt.setCompressionMode(compression);
    crypt.setIntegrityProtectionMode(integrity);
    const QByteArray frame = crypt.encryptToByteArray(plain);
    QCOMPARE(crypt.lastError(), SimpleCrypt::NoError);
    QCOMPARE(frame.at(0), char(0x03));

    const bool shrinks = qCompress(plain, 9).size() < plain.size();
    const bool compressed = compression == SimpleCrypt::CompressAlways ||
                            (compression == SimpleCrypt::CompressAuto && shrinks);
    const char flags =
        char((compressed ? 0x01 : 0) | (integrity == SimpleCrypt::IntegrityChecksum ? 0x02 : 0) |
             (integrity == SimpleCrypt::IntegrityHash ? 0x04 : 0));
    QCOMPARE(frame.at(1), flags);

    // A second object with the same key reads it, in every mode of its own.
    SimpleCrypt reader(kKey);
    reader.setIntegrityProtectionMode(SimpleCrypt::IntegrityNone);
    reader.setCompressionMode(SimpleCrypt::CompressNever);
    QCOMPARE(reader.decryptToByteArray(frame), plain);
    QCOMPARE(reader.lastError(), SimpleCrypt::NoError);

    // The string forms: Base64 in Latin-1, UTF-8 text, all bytes kept.
    const QString text = QString::fromUtf8(plain);
    const QString cypherText = crypt.encryptToString(text);
    QVERIFY(!QByteArray::fromBase64(cypherText.toLatin1()).isEmpty());
    QCOMPARE(reader.decryptToString(cypherText), text);
    QCOMPARE(reader.decryptToByteArray(crypt.encryptToString(plain)), plain);
    QCOMPARE(reader.decryptToString(crypt.encryptToByteArray(text)), text);
}

void TestSimpleCrypt::framesMatchReference_data()
{
    addModeRows();
}

void TestSimpleCrypt::framesMatchReference()
{
    QFETCH(SimpleCrypt::CompressionMode, compression);
    QFETCH(SimpleCrypt::IntegrityProtectionMode, integrity);
    QFETCH(QString, input);
    const QByteArray plain = sampleInput(input);
    SimpleCrypt crypt(kKey);
    crypt.setCompressionMode(compression);
    crypt.setIntegrityProtectionMode(integrity);

    // Ours -> reference, and the reference rebuilds the very same bytes from its random byte.
    const QByteArray frame = crypt.encryptToByteArray(plain);
    QByteArray decoded;
    uchar random = 0;
    QVERIFY(ref::decrypt(kKey, frame, decoded, &random));
    QCOMPARE(decoded, plain);
    QCOMPARE(ref::encrypt(kKey, frame.at(1) & 0x01, int(integrity), random, plain), frame);

    // Reference -> ours, for every random byte value class and both compression choices.
    for (const bool compress : {false, true}) {
        for (const uchar r : {uchar(0x00), uchar(0x7f), uchar(0xff)}) {
            const QByteArray foreign = ref::encrypt(kKey, compress, int(integrity), r, plain);
            QCOMPARE(crypt.decryptToByteArray(foreign), plain);
            QCOMPARE(crypt.lastError(), SimpleCrypt::NoError);
        }
    }
}

void TestSimpleCrypt::randomByteVaries()
{
    SimpleCrypt crypt(kKey);
    crypt.setIntegrityProtectionMode(SimpleCrypt::IntegrityNone);
    QSet<int> randoms;
    QSet<QByteArray> frames;
    for (int i = 0; i < 32; ++i) {
        const QByteArray frame = crypt.encryptToByteArray(QByteArray("same"));
        QCOMPARE(frame.at(0), char(0x03));
        QByteArray plain;
        uchar random = 0;
        QVERIFY(ref::decrypt(kKey, frame, plain, &random));
        randoms.insert(random);
        frames.insert(frame);
    }
    QVERIFY(randoms.size() > 1);
    QCOMPARE(frames.size(), randoms.size()); // the random byte is what makes frames differ
}

void TestSimpleCrypt::tamperedFramesFail_data()
{
    QTest::addColumn<SimpleCrypt::IntegrityProtectionMode>("integrity");
    QTest::addColumn<SimpleCrypt::CompressionMode>("compression");
    QTest::newRow("checksum") << SimpleCrypt::IntegrityChecksum << SimpleCrypt::CompressNever;
    QTest::newRow("hash") << SimpleCrypt::IntegrityHash << SimpleCrypt::CompressNever;
    QTest::newRow("checksum, compressed")
        << SimpleCrypt::IntegrityChecksum << SimpleCrypt::CompressAlways;
    QTest::newRow("hash, compressed") << SimpleCrypt::IntegrityHash << SimpleCrypt::CompressAlways;
}

void TestSimpleCrypt::tamperedFramesFail()
{
    QFETCH(SimpleCrypt::IntegrityProtectionMode, integrity);
    QFETCH(SimpleCrypt::CompressionMode, compression);
    SimpleCrypt crypt(kKey);
    crypt.setIntegrityProtectionMode(integrity);
    crypt.setCompressionMode(compression);
    const QByteArray frame = crypt.encryptToByteArray(QByteArray("patient name and birth date"));
    // Every byte of the block, flipped in two ways. (The flags byte is outside the integrity
    // field by the frame's design.)
    for (int position = 2; position < frame.size(); ++position) {
        for (const char mask : {char(0x01), char(0x80)}) {
            QByteArray bad = frame;
            bad[position] = char(bad[position] ^ mask);
            const QByteArray result = crypt.decryptToByteArray(bad);
            QVERIFY2(result.isEmpty(), qPrintable(QStringLiteral("position %1").arg(position)));
            QCOMPARE(crypt.lastError(), SimpleCrypt::IntegrityError);
        }
    }
    // The untouched frame still reads after all the failures.
    QCOMPARE(crypt.decryptToByteArray(frame), QByteArray("patient name and birth date"));
    QCOMPARE(crypt.lastError(), SimpleCrypt::NoError);
}

void TestSimpleCrypt::wrongKey()
{
    SimpleCrypt writer(kKey);
    SimpleCrypt reader(~kKey);
    for (const auto mode : {SimpleCrypt::IntegrityChecksum, SimpleCrypt::IntegrityHash}) {
        writer.setIntegrityProtectionMode(mode);
        QVERIFY(
            reader.decryptToByteArray(writer.encryptToByteArray(QByteArray("secret"))).isEmpty());
        QCOMPARE(reader.lastError(), SimpleCrypt::IntegrityError);
    }
    // Without integrity protection a wrong key goes unnoticed.
    writer.setIntegrityProtectionMode(SimpleCrypt::IntegrityNone);
    writer.setCompressionMode(SimpleCrypt::CompressNever);
    const QByteArray garbage =
        reader.decryptToByteArray(writer.encryptToByteArray(QByteArray("secret")));
    QCOMPARE(reader.lastError(), SimpleCrypt::NoError);
    QCOMPARE(garbage.size(), 6);
    QVERIFY(garbage != "secret");
}

void TestSimpleCrypt::errors_data()
{
    QTest::addColumn<bool>("withKey");
    QTest::addColumn<QByteArray>("cypher");
    QTest::addColumn<SimpleCrypt::Error>("error");
    QTest::addColumn<QString>("warning");
    const QString version = QStringLiteral("Invalid version or not a cyphertext.");
    QTest::newRow("no key") << false << QByteArray::fromHex("0300543e54") << SimpleCrypt::NoKeyError
                            << "No key set.";
    QTest::newRow("empty") << true << QByteArray() << SimpleCrypt::VersionError << version;
    QTest::newRow("version 2") << true << QByteArray::fromHex("0200543e54")
                               << SimpleCrypt::VersionError << version;
    QTest::newRow("plain text") << true << QByteArray("hello") << SimpleCrypt::VersionError
                                << version;
    // Damaged frames fail quietly.
    QTest::newRow("version only") << true << QByteArray::fromHex("03")
                                  << SimpleCrypt::IntegrityError << QString();
    QTest::newRow("no random byte")
        << true << QByteArray::fromHex("0300") << SimpleCrypt::IntegrityError << QString();
}

void TestSimpleCrypt::errors()
{
    QFETCH(bool, withKey);
    QFETCH(QByteArray, cypher);
    QFETCH(SimpleCrypt::Error, error);
    QFETCH(QString, warning);

    SimpleCrypt crypt;
    QVERIFY(!crypt.hasKey());
    if (withKey) {
        crypt.setKey(0);
        QVERIFY(crypt.hasKey());
    }
    if (!warning.isEmpty())
        QTest::ignoreMessage(QtWarningMsg, qPrintable(warning));
    QVERIFY(crypt.decryptToByteArray(cypher).isEmpty());
    QCOMPARE(crypt.lastError(), error);

    // The Base64 road ends the same way.
    if (!warning.isEmpty())
        QTest::ignoreMessage(QtWarningMsg, qPrintable(warning));
    QVERIFY(crypt.decryptToString(QString::fromLatin1(cypher.toBase64())).isEmpty());
    QCOMPARE(crypt.lastError(), error);

    if (!withKey) {
        QTest::ignoreMessage(QtWarningMsg, "No key set.");
        QVERIFY(crypt.encryptToByteArray(QByteArray("x")).isEmpty());
        QCOMPARE(crypt.lastError(), SimpleCrypt::NoKeyError);
    }
}

void TestSimpleCrypt::hostileFrames_data()
{
    QTest::addColumn<char>("flags");
    QTest::addColumn<QByteArray>("payload"); // block content after the random byte
    const QByteArray stream = ref::compress(QByteArray(5000, 'z')).mid(4);
    auto sized = [](quint32 inSize) {
        return QByteArray::fromHex(QByteArray::number(inSize, 16).rightJustified(8, '0'));
    };
    QTest::newRow("checksum flag, 1 byte") << char(0x02) << QByteArray("a");
    QTest::newRow("hash flag, 19 bytes") << char(0x04) << QByteArray(19, 'a');
    QTest::newRow("compressed, 3 bytes") << char(0x01) << QByteArray("abc");
    QTest::newRow("compressed, zero size with bytes") << char(0x01) << sized(0) + "xyz";
    QTest::newRow("compressed, 4 bytes nonzero") << char(0x01) << sized(10);
    QTest::newRow("compressed, garbage stream") << char(0x01) << sized(100) + QByteArray(50, 'q');
    QTest::newRow("compressed, huge size, garbage") << char(0x01) << sized(0xFFFFFFFF) + "garbage";
    QTest::newRow("compressed, 2 GiB claimed, real stream")
        << char(0x01) << sized(0x7FFFFFF0) + stream;
    QTest::newRow("compressed, 1 GiB claimed, truncated")
        << char(0x01) << sized(0x40000000) + stream.left(stream.size() / 2);
    QTest::newRow("compressed, size too small") << char(0x01) << sized(4999) + stream;
    QTest::newRow("compressed, truncated stream")
        << char(0x01) << sized(5000) + stream.left(stream.size() - 1);
    QTest::newRow("all flags, short") << char(0x07) << QByteArray("x");
}

void TestSimpleCrypt::hostileFrames()
{
    QFETCH(char, flags);
    QFETCH(QByteArray, payload);
    SimpleCrypt crypt(kKey);
    QVERIFY(crypt.decryptToByteArray(ref::frame(kKey, flags, "r" + payload)).isEmpty());
    QCOMPARE(crypt.lastError(), SimpleCrypt::IntegrityError);
}

void TestSimpleCrypt::randomInputNeverCrashes()
{
    QRandomGenerator generator(20240305);
    SimpleCrypt crypt(kKey);
    const QByteArray good = ref::encrypt(kKey, true, 1, 9, QByteArray(300, 'g'));
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
        if (cypher.isEmpty())
            QTest::ignoreMessage(QtWarningMsg, "Invalid version or not a cyphertext.");
        const QByteArray result = crypt.decryptToByteArray(cypher);
        const SimpleCrypt::Error error = crypt.lastError();
        QVERIFY(error == SimpleCrypt::NoError || error == SimpleCrypt::IntegrityError ||
                (cypher.isEmpty() && error == SimpleCrypt::VersionError));
        if (error != SimpleCrypt::NoError)
            QVERIFY(result.isEmpty());
    }
    // Base64 garbage through the string road as well; the only warning allowed is the version's.
    sWarnings.clear();
    const QtMessageHandler previous = qInstallMessageHandler(collectMessages);
    for (int round = 0; round < 2000; ++round) {
        QString text = QString::fromLatin1(randomBytes(generator, int(generator.bounded(60))));
        if (round % 2)
            text = QStringLiteral("A") + text; // decodes to a first byte of 0x00 to 0x03
        crypt.decryptToString(text);
    }
    qInstallMessageHandler(previous);
    sWarnings.removeDuplicates();
    sWarnings.removeAll(QStringLiteral("Invalid version or not a cyphertext."));
    QCOMPARE(sWarnings, QStringList());
}

// A claimed size must not make the cipher reserve memory: the whole hostile set runs with the
// address space capped a little above what the process already uses.
void TestSimpleCrypt::hostileFramesStayBounded()
{
#ifdef Q_OS_LINUX
    QFile statm(QStringLiteral("/proc/self/statm"));
    QVERIFY(statm.open(QIODevice::ReadOnly));
    const qint64 pages = statm.readAll().split(' ').value(0).toLongLong();
    QVERIFY(pages > 0);
    const rlim_t cap = rlim_t(pages) * rlim_t(sysconf(_SC_PAGESIZE)) + (rlim_t(256) << 20);
    struct rlimit old;
    QCOMPARE(getrlimit(RLIMIT_AS, &old), 0);
    struct rlimit limited = old;
    limited.rlim_cur = std::min(cap, old.rlim_cur);
    QCOMPARE(setrlimit(RLIMIT_AS, &limited), 0);

    const QByteArray stream = ref::compress(QByteArray(100000, 'z')).mid(4);
    SimpleCrypt crypt(kKey);
    int failures = 0;
    for (const quint32 claimed : {0xFFFFFFFFu, 0x7FFFFFF0u, 0x40000000u, 0x20000000u}) {
        QByteArray payload(4, '\0');
        payload[0] = char(claimed >> 24);
        payload[1] = char(claimed >> 16);
        payload[2] = char(claimed >> 8);
        payload[3] = char(claimed);
        // Truncated: the stream never ends, so a trusting reader would fill the whole claim.
        const QByteArray cut =
            ref::frame(kKey, 0x01, "r" + payload + stream.left(stream.size() / 2));
        failures += crypt.decryptToByteArray(cut).isEmpty() &&
                    crypt.lastError() == SimpleCrypt::IntegrityError;
        // A real stream under a size claim that is too large still inflates to what it holds.
        // Claims beyond what a byte array can hold are refused outright.
        const QByteArray whole = ref::frame(kKey, 0x01, "r" + payload + stream);
        const QByteArray result = crypt.decryptToByteArray(whole);
        if (claimed < 0x7FFFFF00u)
            failures += result == QByteArray(100000, 'z') ? 0 : 100;
        else
            failures += result.isEmpty() && crypt.lastError() == SimpleCrypt::IntegrityError;
    }
    QCOMPARE(setrlimit(RLIMIT_AS, &old), 0);
    QCOMPARE(failures, 6);
#else
    QSKIP("needs Linux address-space limits");
#endif
}

QTEST_GUILESS_MAIN(TestSimpleCrypt)
#include "tst_simplecrypt.moc"
