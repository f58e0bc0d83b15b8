// The parameter-file reader: what it accepts, and that everything else is refused with the
// file, the line and the reason instead of half a bundle.
#include "TestSupport.h"
#include "pnresources/VelmarMesh.h"

#include <QFile>
#include <QTemporaryDir>
#include <QtTest>

namespace {

// "name=value" per parameter, joined by "|".
QString describe(const VelmarMesh& inMesh)
{
    QStringList parts;
    for (int i = 0; i < inMesh.size(); ++i) {
        const auto* parameter = dynamic_cast<const DvParameter*>(inMesh[i]);
        parts << QString::fromUtf8(parameter->getName().c_str()) + "=" +
                     QString::fromUtf8(parameter->getString().c_str());
    }
    return parts.join('|');
}

} // namespace

class TestVelmarMesh : public QObject
{
    Q_OBJECT

private slots:
    void parse_data();
    void parse();
    void read();
};

void TestVelmarMesh::parse_data()
{
    QTest::addColumn<QByteArray>("text");
    QTest::addColumn<QString>("expected"); // the parameters, or "!" and the record's message

    QTest::newRow("values and comments")
        << QByteArray("# head\n\nReg {\n  A 1\n\tB \"two  words\"  # note\n  C \"\"\n"
                      "  D x#y\n  # inside\n  Other.Version-1_x \"C:\\Apps\\Old\"\n}\n\n# end\n")
        << "A=1|B=two  words|C=|D=x#y|Other.Version-1_x=C:\\Apps\\Old";
    QTest::newRow("CR LF, byte order mark, repeated names keep order and case")
        << QByteArray(
               "\xEF\xBB\xBF{\r\n  Name \"\xC3\xA9t\xC3\xA9\"\r\n  name 2\r\n  Name 3\r\n}\r\n")
        << "Name=\xC3\xA9t\xC3\xA9|name=2|Name=3";
    QTest::newRow("empty block") << QByteArray("{  # nothing\n}") << "";
    QTest::newRow("empty file") << QByteArray() << "!mem: no parameter block";
    QTest::newRow("no brace") << QByteArray("A 1\n")
                              << "!mem: line 1: the parameter block must open with '{'";
    QTest::newRow("truncated") << QByteArray("{\n A 1\n A")
                               << "!mem: line 3: a blank and a "
                                  "value must follow the name";
    QTest::newRow("no closing brace")
        << QByteArray("{\n A 1\n") << "!mem: the closing '}' is missing";
    QTest::newRow("no value") << QByteArray("{\n A  # c\n}")
                              << "!mem: line 2: the value is missing";
    QTest::newRow("open quote") << QByteArray("{\n A \"x\n}")
                                << "!mem: line 2: the quoted value is not closed";
    QTest::newRow("two values") << QByteArray("{\n A x y\n}")
                                << "!mem: line 2: unexpected text after the value";
    QTest::newRow("text after quote")
        << QByteArray("{\n A \"x\"y\n}") << "!mem: line 2: unexpected text after the value";
    QTest::newRow("bad name") << QByteArray("{\n 1A x\n}")
                              << "!mem: line 2: a parameter name is expected";
    QTest::newRow("nested block") << QByteArray("{\n {\n}\n}")
                                  << "!mem: line 2: a parameter name is expected";
    QTest::newRow("text after brace")
        << QByteArray("{\n} x\n") << "!mem: line 2: the closing '}' must stand alone on its line";
    QTest::newRow("line after block")
        << QByteArray("{\n}\nB 1\n") << "!mem: line 3: only comments may follow the closing '}'";
    QTest::newRow("NUL") << QByteArray("{\n A x\0y\n}", 11) << "!mem: line 2: control character";
    QTest::newRow("lone CR") << QByteArray("{\n A x\ry\n}") << "!mem: line 2: control character";
    QTest::newRow("Latin-1") << QByteArray("{\n A \xE9t\xE9\n}") << "!mem: not UTF-8 text";
    QTest::newRow("overlong") << QByteArray("{\n A \xC0\xAF\n}") << "!mem: not UTF-8 text";
    QTest::newRow("surrogate") << QByteArray("{\n A \xED\xA0\x80\n}") << "!mem: not UTF-8 text";
    QTest::newRow("beyond U+10FFFF")
        << QByteArray("{\n A \xF4\x90\x80\x80\n}") << "!mem: not UTF-8 text";
    QTest::newRow("cut sequence") << QByteArray("{\n}\n#\xE2\x82") << "!mem: not UTF-8 text";
    QTest::newRow("too large") << "{\n}\n#" + QByteArray(int(VelmarMesh::kMaxFileSize), 'x')
                               << "!mem: larger than 1048576 bytes";
}

void TestVelmarMesh::parse()
{
    QFETCH(QByteArray, text);
    QFETCH(QString, expected);
    RkResult result;
    const std::unique_ptr<VelmarMesh> mesh = VelmarMesh::parse(text.toStdString(), "mem", &result);
    if (!expected.startsWith('!')) {
        QVERIFY_OK(result);
        QVERIFY(mesh);
        QCOMPARE(describe(*mesh), expected);
        return;
    }
    QVERIFY(!mesh);
    QCOMPARE(result.records().size(), std::size_t(1));
    const RkResult::Record& record = result.records().front();
    QCOMPARE(QString::fromStdString(record.message), expected.mid(1));
    QCOMPARE(record.where, "src/core/pnresources/VelmarMesh:VelmarMesh::parse");
    QCOMPARE(record.detail, "cond[error.empty()]");
    // Without a result the refusal is the same, and nothing else happens.
    QVERIFY(!VelmarMesh::parse(text.toStdString(), "mem", nullptr));
}

void TestVelmarMesh::read()
{
    QTemporaryDir dir;
    const QByteArray good = QFile::encodeName(dir.path() + "/good");
    QFile file(QString::fromLocal8Bit(good));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("R {\n A 1\n}\n");
    file.close();
    RkResult result;
    const std::unique_ptr<VelmarMesh> mesh = VelmarMesh::read(good, &result);
    QVERIFY(mesh);
    QCOMPARE(describe(*mesh), "A=1");

    for (const QByteArray& path : {good + "-missing", QFile::encodeName(dir.path())}) {
        RkResult failed;
        QVERIFY(!VelmarMesh::read(path, &failed));
        QCOMPARE(failed.records().size(), std::size_t(1));
        QVERIFY2(
            failed.records().front().message.rfind(path.toStdString() + ": cannot be read", 0) == 0,
            failed.records().front().message.c_str());
    }
    QVERIFY(!VelmarMesh::read(nullptr, nullptr));

    // A huge file is refused after reading just past the limit.
    QVERIFY(file.open(QIODevice::Append));
    QVERIFY(file.resize(64 * 1024 * 1024));
    file.close();
    RkResult huge;
    QVERIFY(!VelmarMesh::read(good, &huge));
    QCOMPARE(huge.records().front().message, good.toStdString() + ": larger than 1048576 bytes");
}

QTEST_GUILESS_MAIN(TestVelmarMesh)
#include "tst_velmarmesh.moc"
