// XML helpers: typed DOM attributes, the chained builder, the aligned stream writer and the text
// stream operators.
#include "zubase/ZuDom.h"
#include "zubase/ZuTextStream.h"
#include "zubase/ZuXmlBuilder.h"
#include "zubase/ZuXmlStreamWriter.h"

#include <QBuffer>
#include <QtTest>

class TestXml : public QObject
{
    Q_OBJECT

private slots:
    void stringToBool_data();
    void stringToBool();
    void integerList_data();
    void integerList();
    void typedAttributes_data();
    void typedAttributes();
    void builder();
    void writerLayout_data();
    void writerLayout();
    void writerWithoutDevice();
    void textStreamOperators_data();
    void textStreamOperators();
};

void TestXml::stringToBool_data()
{
    QTest::addColumn<QStringList>("texts");
    QTest::addColumn<int>("expected");
    QTest::newRow("yes words") << QStringList{"TRUE", "On", "yes", "1"} << 1;
    QTest::newRow("no words") << QStringList{"0", "no", "OFF", "False"} << 0;
    QTest::newRow("neither") << QStringList{"", " true", "2", "yes ", "y"} << -1;
}

void TestXml::stringToBool()
{
    QFETCH(QStringList, texts);
    for (const QString& text : texts)
        QTEST(ZuDom::qStringToBool(text), "expected");
}

void TestXml::integerList_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QList<int>>("numbers"); // what was read until the failure
    QTest::newRow("three") << "1 2 3" << true << QList<int>{1, 2, 3};
    QTest::newRow("empty text") << "" << false << QList<int>{};
    QTest::newRow("double blank") << "1  2" << false << QList<int>{1};
    QTest::newRow("word inside") << "1 x 3" << false << QList<int>{1};
    QTest::newRow("trailing blank") << "7 " << false << QList<int>{7};
}

void TestXml::integerList()
{
    QFETCH(QString, text);
    QList<int> out{99, 98}; // stale content must go
    QTEST(ZuDom::readIntegerListParams(text, out), "ok");
    QTEST(out, "numbers");
}

// Reads int, float and bool from attribute "v", starting from -7, -7.5 and true; "!" marks a
// failed read, which must leave the start value.
void TestXml::typedAttributes_data()
{
    QTest::addColumn<QString>("xml");
    QTest::addColumn<QString>("read");
    auto row = [](const char* inName, const char* inXml, const char* inRead) {
        QTest::newRow(inName) << QString::fromLatin1(inXml) << QString::fromLatin1(inRead);
    };
    row("number", "<e v=\"12\"/>", "12 12 !true");
    row("zero", "<e v=\"0\"/>", "0 0 false");
    row("float", "<e v=\"2.5\"/>", "!-7 2.5 !true");
    row("trailing letters", "<e v=\"12abc\"/>", "!-7 !-7.5 !true");
    row("word", "<e v=\"Off\"/>", "!-7 !-7.5 false");
    row("missing", "<e/>", "!-7 !-7.5 !true");
}

void TestXml::typedAttributes()
{
    QFETCH(QString, xml);
    QDomDocument document;
    QVERIFY(document.setContent(xml));
    const QDomElement element = document.documentElement();
    int i = -7;
    float f = -7.5f;
    bool b = true;
    const bool intOk = ZuDom::getAttribute(element, "v", i);
    const bool floatOk = ZuDom::getAttribute(element, "v", f);
    const bool boolOk = ZuDom::getAttribute(element, "v", b);
    QTEST(QString::asprintf("%s%d %s%g %s%s", intOk ? "" : "!", i, floatOk ? "" : "!", double(f),
                            boolOk ? "" : "!", b ? "true" : "false"),
          "read");
    // A null element reads like a missing attribute, and setting on it is ignored.
    QVERIFY(!ZuDom::getAttribute(QDomElement(), "v", i));
    ZuDom::setAttribute(QDomElement(), "v", QStringLiteral("1"));
}

void TestXml::builder()
{
    ZuXmlBuilder builder;
    ZuXmlBuilder::Element root = builder.createRootElement(QStringLiteral("Config"));
    root.setAttribute(QStringLiteral("version"), QStringLiteral("2"))
        .addChild(QStringLiteral("Item"), QStringLiteral("a < b"))
        .addComment(QStringLiteral("note"))
        .parent()
        .addChild(QStringLiteral("Data"))
        .addCDATA(QStringLiteral("x]y"))
        .addText(QStringLiteral("t"));
    QVERIFY(root.parent().isNull());
    QCOMPARE(QDomElement(root).tagName(), QStringLiteral("Config"));

    // Copies of the builder share the document; clear() drops one handle only.
    ZuXmlBuilder copy = builder;
    builder.clear();
    QVERIFY(builder.document().isNull());
    QCOMPARE(copy.document().toString(-1),
             QStringLiteral("<Config version=\"2\"><Item>a &lt; b<!--note-->\n</Item>"
                            "<Data><![CDATA[x]y]]>t</Data></Config>"));

    // Without a builder nothing is added anywhere.
    ZuXmlBuilder::Element none;
    QVERIFY(none.isNull() && none.addChild(QStringLiteral("a")).isNull() &&
            none.addChild(QStringLiteral("a"), QStringLiteral("t")).isNull() &&
            none.addText(QStringLiteral("t")).isNull() &&
            none.addComment(QStringLiteral("c")).isNull() &&
            none.addCDATA(QStringLiteral("d")).isNull() && none.parent().isNull());
}

// Attributes are written with a blank before them, so an aligned one has a blank more than the
// line break. Steps of a writer script, split at "|": "S name" start, "X name" aligned start, "A
// name=value" attribute, "E" end, "C text" section comment, "L" empty line, "Y" aligned empty line,
// "I n" indent, "T text" characters.
void TestXml::writerLayout_data()
{
    QTest::addColumn<bool>("autoFormat");
    QTest::addColumn<QString>("script");
    QTest::addColumn<QString>("expected"); // what follows the XML declaration
    auto row = [](const char* inName, bool inAutoFormat, const QString& inScript,
                  const QString& inExpected) {
        QTest::newRow(inName) << inAutoFormat << inScript << inExpected;
    };
    row("aligned root", true, "X Root|A a=1|A bb=2|A c=3|E",
        "\n<Root a=\"1\"\n      bb=\"2\"\n      c=\"3\"/>\n");
    row("plain start keeps one line", true, "S Root|A a=1|A bb=2|A c=3|E",
        "\n<Root a=\"1\" bb=\"2\" c=\"3\"/>\n");
    // The child's start also carried the parent's '>' and the line feed: 12 bytes, 11 blanks.
    row("aligned child", true, "S Root|X Child|A x=1|A y=2|E|E",
        "\n<Root>\n    <Child x=\"1\"\n            y=\"2\"/>\n</Root>\n");
    row("plain start after aligned one", true, "X Root|A a=1|S Child|A x=1|A y=2|E|E",
        "\n<Root a=\"1\">\n    <Child x=\"1\" y=\"2\"/>\n</Root>\n");
    const QString longName(60, QLatin1Char('n'));
    row("indent capped at 40", true, "X " + longName + "|A a=1|A b=2|E",
        "\n<" + longName + " a=\"1\"\n" + QString(40, QLatin1Char(' ')) + "b=\"2\"/>\n");
    // Root: 3 - 4 + 6 = 5, so the aligned empty line carries 4 blanks, which the next element
    // uses as its indentation (the base writer does not indent after characters).
    row("section comment after aligned start", true, "X Root|A a=1|C Part one|S Item|E|E",
        "\n<Root a=\"1\">\n\n<!--Part one-->\n\n    <Item/>\n</Root>\n");
    // Without alignment the comment is followed by the indentation of the current depth.
    row("section comment after plain start", true, "S Root|S Group|C Next|E|E",
        "\n<Root>\n    <Group>\n\n<!--Next-->\n\n        </Group>\n</Root>\n");
    row("empty section comment writes nothing", false, "S Root|C |E", "<Root/>\n");
    // "<Root" took 5 bytes: 3 - 4 + 5 = 4, so 3 blanks.
    row("empty lines and indent", false, "X Root|Y|L|I 2|E", "<Root\n   \n\n        />\n");
    row("aligned empty line needs aligned start", false, "S Root|Y|T x|E", "<Root>x</Root>\n");
}

void TestXml::writerLayout()
{
    QFETCH(bool, autoFormat);
    QFETCH(QString, script);
    QByteArray out;
    ZuXmlStreamWriter w(&out);
    w.setAutoFormatting(autoFormat);
    w.writeStartDocument();
    for (const QString& step : script.split(QLatin1Char('|'))) {
        const QString arg = step.mid(2);
        // clang-format off
        switch (step.at(0).toLatin1()) {
        case 'S': w.writeStartElement(arg); break;
        case 'X': w.writeStartElementExt(arg); break;
        case 'A': w.writeAttribute(arg.section('=', 0, 0), arg.section('=', 1)); break;
        case 'E': w.writeEndElement(); break;
        case 'C': w.writeSectionComment(arg); break;
        case 'L': w.writeEmptyLine(); break;
        case 'Y': w.writeEmptyLineExt(); break;
        case 'I': w.indent(arg.toInt()); break;
        case 'T': w.writeCharacters(arg); break;
        default: QFAIL(qPrintable("bad step " + step));
        }
        // clang-format on
    }
    w.writeEndDocument();
    QTEST(QString::fromUtf8(out).section(QLatin1Char('>'), 1), "expected");
}

void TestXml::writerWithoutDevice()
{
    // A closed device gets no layout bytes; the base writer's own output is its business.
    QBuffer buffer;
    ZuXmlStreamWriter writer(&buffer);
    writer.writeStartElementExt(QStringLiteral("Root"));
    writer.writeAttribute(QStringLiteral("a"), QStringLiteral("1"));
    writer.writeAttribute(QStringLiteral("b"), QStringLiteral("2"));
    writer.writeEmptyLine();
    writer.writeEmptyLineExt();
    writer.indent(3);
    writer.writeSectionComment(QStringLiteral("c"));
    QVERIFY(buffer.data().isEmpty());

    // Tabs as auto-formatting indent count as one blank per step.
    QByteArray out;
    ZuXmlStreamWriter tabs(&out);
    tabs.setAutoFormattingIndent(-1);
    tabs.indent(3);
    QCOMPARE(out, QByteArray("\n   "));
}

// The readers look at the whole string of the stream, not at what is left of it.
void TestXml::textStreamOperators_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("boolValue");
    QTest::addColumn<QUuid>("uuid");
    const QUuid id(QStringLiteral("{6f1a3c2e-1b2d-4e5f-8a9b-0c1d2e3f4a5b}"));
    QTest::newRow("True") << "True" << true << QUuid();
    QTest::newRow("yes is not true") << "yes" << false << QUuid();
    QTest::newRow("uuid") << id.toString() << false << id;
    QTest::newRow("uuid without braces") << "6f1a3c2e-1b2d-4e5f-8a9b-0c1d2e3f4a5b" << false << id;
}

void TestXml::textStreamOperators()
{
    QFETCH(QString, text);
    QFETCH(QUuid, uuid);
    QTextStream in(&text);
    QString firstWord;
    bool readBool = false;
    QUuid readUuid = QUuid::createUuid();
    in >> firstWord >> readBool >> readUuid;
    QTEST(readBool, "boolValue");
    QCOMPARE(readUuid, uuid);

    QString written;
    QTextStream out(&written);
    out << true << ' ' << false << ' ' << uuid;
    out.flush();
    QCOMPARE(written, "true false " + uuid.toString());
}

QTEST_GUILESS_MAIN(TestXml)
#include "tst_xml.moc"
