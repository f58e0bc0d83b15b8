// String cipher: golden frames (decoded once by an independent reader of the byte layout),
// tampering, the random byte, and damaged or hostile frames under an address-space cap.
#include "zubase/SimpleCrypt.h"

#include <QtTest>

#include <sys/resource.h>
#include <unistd.h>

Q_DECLARE_METATYPE(SimpleCrypt::Error)

namespace {

const quint64 kKey = Q_UINT64_C(0x0c2ad4a4acb9f023);
const QByteArray kText = "Grüße";

// The random byte opens the block and the chaining carries it into every later byte, so two
// frames of the same input differ by one and the same XOR all along the block.
bool sameUpToRandomByte(const QByteArray& inA, const QByteArray& inB)
{
    bool same = inA.size() == inB.size() && inA.size() > 2 && inA.left(2) == inB.left(2);
    for (int p = 3; same && p < inA.size(); ++p)
        same = (inA[p] ^ inB[p]) == (inA[2] ^ inB[2]);
    return same;
}

// The cipher's own frame of inPayload (behind the random byte) with the flags byte replaced.
QByteArray frame(char inFlags, const QByteArray& inPayload)
{
    SimpleCrypt crypt(kKey);
    crypt.setCompressionMode(SimpleCrypt::CompressNever);
    crypt.setIntegrityProtectionMode(SimpleCrypt::IntegrityNone);
    QByteArray bytes = crypt.encryptToByteArray(inPayload);
    bytes[1] = inFlags;
    return bytes;
}

} // namespace

class TestSimpleCrypt : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    // A claimed size must not make the cipher reserve memory: the suite runs with the address
    // space capped a little above what the process already uses.
    void initTestCase()
    {
        QFile statm(QStringLiteral("/proc/self/statm"));
        QVERIFY(statm.open(QIODevice::ReadOnly));
        const qint64 pages = statm.readAll().split(' ').value(0).toLongLong();
        struct rlimit limit;
        QVERIFY(pages > 0 && getrlimit(RLIMIT_AS, &limit) == 0);
        limit.rlim_cur = std::min(
            rlim_t(pages) * rlim_t(sysconf(_SC_PAGESIZE)) + (rlim_t(256) << 20), limit.rlim_cur);
        QCOMPARE(setrlimit(RLIMIT_AS, &limit), 0);
    }

    // Frames as other readers and writers of the format see them: both directions, tampering.
    void golden_data()
    {
        QTest::addColumn<int>("compression");
        QTest::addColumn<int>("integrity");
        QTest::addColumn<QByteArray>("plain");
        QTest::addColumn<QByteArray>("frame");
        auto row = [](const char* inName, int inCompression, int inIntegrity,
                      const QByteArray& inPlain, const char* inHex) {
            QTest::newRow(inName) << inCompression << inIntegrity << inPlain
                                  << QByteArray::fromHex(inHex);
        };
        row("nothing", 2, 0, QByteArray(), "030076");
        row("checksum", 2, 1, kText, "0302eeb4e70cdacd5b9428bd");
        row("hash", 2, 2, kText, "0304eee818c178c2f34b077b444004e0c8f313de974b9b08509f003315dc");
        row("checksum, whole key rounds", 2, 1, "The quick brown fox jumps over the lazy dog",
            "0302ee8d6c9458e9e39ec8518b4cc87e2645118f16dc17bbb1d7811cd50a8e35690051814c8849bdfb96cf"
            "46df17dc6f");
        row("compressed nothing", 1, 2, QByteArray(),
            "0305bbdb0b6db182edebe0418b64db31498061c3e3ab7ca8828ead");
        row("auto, too short to shrink", 0, 0, "hi", "03001d8555");
        row("auto, shrinks", 0, 1, QByteArray(40, 'x'),
            "0303ee45ea46e2363440b9e2f37fd5012ba713f189");
    }
    void golden()
    {
        QFETCH(int, compression);
        QFETCH(int, integrity);
        QFETCH(QByteArray, plain);
        QFETCH(QByteArray, frame);
        SimpleCrypt crypt(kKey); // its own modes do not matter for decryption
        QCOMPARE(crypt.decryptToString(QString::fromLatin1(frame.toBase64())),
                 QString::fromUtf8(plain));
        QCOMPARE(crypt.lastError(), SimpleCrypt::NoError);
        crypt.setCompressionMode(SimpleCrypt::CompressionMode(compression));
        crypt.setIntegrityProtectionMode(SimpleCrypt::IntegrityProtectionMode(integrity));
        const QString base64 = crypt.encryptToString(QString::fromUtf8(plain));
        QVERIFY(sameUpToRandomByte(QByteArray::fromBase64(base64.toLatin1()), frame));
        // With integrity protection any changed byte of the block is caught.
        for (int p = 2; integrity != 0 && p < frame.size(); ++p) {
            QByteArray bad = frame;
            bad[p] = char(bad[p] ^ (p % 2 ? 0x01 : 0x80));
            QVERIFY2(crypt.decryptToByteArray(bad).isEmpty(), qPrintable(QString::number(p)));
            QCOMPARE(crypt.lastError(), SimpleCrypt::IntegrityError);
        }
    }

    // The random byte comes from the thread's generator, so the same input gives other frames.
    void randomByteVaries()
    {
        SimpleCrypt crypt(kKey);
        QSet<QByteArray> frames;
        for (int i = 0; i < 32; ++i)
            frames.insert(crypt.encryptToByteArray(QByteArray("same")));
        QVERIFY(frames.size() > 1);
    }

    void badInput_data()
    {
        QTest::addColumn<QByteArray>("cypher");
        QTest::addColumn<SimpleCrypt::Error>("error"); // NoKeyError: decrypted without a key
        QTest::addColumn<QByteArray>("expected");
        auto row = [](const char* inName, const QByteArray& inCypher,
                      SimpleCrypt::Error inError = SimpleCrypt::IntegrityError,
                      const QByteArray& inExpected = QByteArray()) {
            QTest::newRow(inName) << inCypher << inError << inExpected;
        };
        auto sized = [](quint32 inSize) {
            return QByteArray::fromHex(QByteArray::number(inSize, 16).rightJustified(8, '0'));
        };
        const QByteArray data(100000, 'z');
        const QByteArray stream = qCompress(data, 9).mid(4);

        row("no key", frame(0, "hi"), SimpleCrypt::NoKeyError);
        row("version 2", QByteArray::fromHex("0200543e54"), SimpleCrypt::VersionError);
        row("no random byte", QByteArray::fromHex("0300"));
        row("checksum flag, 1 byte", frame(0x02, "a"));
        row("hash flag, 19 bytes", frame(0x04, QByteArray(19, 'a')));
        row("compressed, 3 bytes", frame(0x01, "abc"));
        row("garbage stream", frame(0x01, sized(100) + "qqqqqqqq"));
        row("size too small", frame(0x01, sized(99999) + stream));
        row("truncated stream", frame(0x01, sized(100000) + stream.chopped(1)));
        // Huge claims: a reader that trusted them would reserve or fill them and die under the cap.
        row("4 GiB, garbage", frame(0x01, sized(0xFFFFFFFF) + "garbage"));
        row("1 GiB, truncated", frame(0x01, sized(0x40000000) + stream.left(stream.size() / 2)));
        // Beyond what a byte array holds: refused; below: inflated as far as the stream reaches.
        row("2 GiB, whole stream", frame(0x01, sized(0x7FFFFFF0) + stream));
        row("1 GiB, whole stream", frame(0x01, sized(0x40000000) + stream), SimpleCrypt::NoError,
            data);
    }
    void badInput()
    {
        QFETCH(QByteArray, cypher);
        QFETCH(SimpleCrypt::Error, error);
        SimpleCrypt crypt;
        if (error != SimpleCrypt::NoKeyError) // the key 0 is a key as well
            crypt.setKey(error == SimpleCrypt::VersionError ? 0 : kKey);
        // Only the missing key and the version are warned about.
        if (error == SimpleCrypt::NoKeyError || error == SimpleCrypt::VersionError) {
            QTest::ignoreMessage(QtWarningMsg, error == SimpleCrypt::NoKeyError
                                                   ? "No key set."
                                                   : "Invalid version or not a cyphertext.");
        }
        QTEST(crypt.decryptToByteArray(cypher), "expected");
        QCOMPARE(crypt.lastError(), error);
        if (error == SimpleCrypt::NoKeyError) {
            QTest::ignoreMessage(QtWarningMsg, "No key set.");
            QVERIFY(crypt.encryptToByteArray(QByteArray("x")).isEmpty());
            QCOMPARE(crypt.lastError(), SimpleCrypt::NoKeyError);
        }
    }
};

QTEST_GUILESS_MAIN(TestSimpleCrypt)
#include "tst_simplecrypt.moc"
