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
    void builderChains();
    void builderWithoutDocument();
    void writerLayout_data();
    void writerLayout();
    void writerWithoutDevice();
    void textStreamOperators_data();
    void textStreamOperators();
};

void TestXml::stringToBool_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("expected");
    const struct
    {
        const char* text;
        int expected;
    } cases[] = {{"TRUE", 1}, {"On", 1},    {"yes", 1},   {"1", 1}, {"0", 0},
                 {"no", 0},   {"OFF", 0},   {"False", 0}, {"", -1}, {" true", -1},
                 {"2", -1},   {"yes ", -1}, {"y", -1}};
    for (const auto& c : cases)
        QTest::newRow(c.text[0] ? c.text : "(empty)") << QString::fromLatin1(c.text) << c.expected;
}

void TestXml::stringToBool()
{
    QFETCH(QString, text);
    QFETCH(int, expected);
    QCOMPARE(ZuDom::qStringToBool(text), expected);
}

void TestXml::integerList_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QList<int>>("numbers");
    QTest::newRow("three") << "1 2 3" << true << QList<int>{1, 2, 3};
    QTest::newRow("negative") << "-4 10" << true << QList<int>{-4, 10};
    QTest::newRow("empty text") << "" << false << QList<int>{};
    QTest::newRow("double blank") << "1  2" << false << QList<int>{1};
    QTest::newRow("word inside") << "1 x 3" << false << QList<int>{1};
    QTest::newRow("trailing blank") << "7 " << false << QList<int>{7};
    QTest::newRow("hex is not base 10") << "0x10" << false << QList<int>{};
}

void TestXml::integerList()
{
    QFETCH(QString, text);
    QFETCH(bool, ok);
    QFETCH(QList<int>, numbers);
    QList<int> out{99, 98}; // stale content must go
    QCOMPARE(ZuDom::readIntegerListParams(text, out), ok);
    QCOMPARE(out, numbers);
}

void TestXml::typedAttributes_data()
{
    QTest::addColumn<QString>("xml");
    QTest::addColumn<bool>("intOk");
    QTest::addColumn<int>("intValue");
    QTest::addColumn<bool>("floatOk");
    QTest::addColumn<float>("floatValue");
    QTest::addColumn<bool>("boolOk");
    QTest::addColumn<bool>("boolValue");
    // Failed reads leave the sentinels -7, -7.5 and true in place.
    QTest::newRow("number") << "<e v=\"12\"/>" << true << 12 << true << 12.0f << false << true;
    QTest::newRow("trailing letters")
        << "<e v=\"12abc\"/>" << false << -7 << false << -7.5f << false << true;
    QTest::newRow("missing") << "<e/>" << false << -7 << false << -7.5f << false << true;
    QTest::newRow("float") << "<e v=\"2.5\"/>" << false << -7 << true << 2.5f << false << true;
    QTest::newRow("zero") << "<e v=\"0\"/>" << true << 0 << true << 0.0f << true << false;
    QTest::newRow("word off") << "<e v=\"Off\"/>" << false << -7 << false << -7.5f << true << false;
    QTest::newRow("word yes") << "<e v=\"YES\"/>" << false << -7 << false << -7.5f << true << true;
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
    QTEST(ZuDom::getAttribute(element, "v", i), "intOk");
    QTEST(i, "intValue");
    QTEST(ZuDom::getAttribute(element, "v", f), "floatOk");
    QTEST(f, "floatValue");
    QTEST(ZuDom::getAttribute(element, "v", b), "boolOk");
    QTEST(b, "boolValue");

    // A null element reads like a missing attribute, and setting on it is ignored.
    QVERIFY(!ZuDom::getAttribute(QDomElement(), "v", i));
    ZuDom::setAttribute(QDomElement(), "v", QStringLiteral("1"));
    ZuDom::setAttribute(element, "w", QStringLiteral("x&y"));
    QCOMPARE(element.attribute(QStringLiteral("w")), QStringLiteral("x&y"));
}

void TestXml::builderChains()
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
    QVERIFY(!root.isNull());

    // Copies of the builder share the document.
    ZuXmlBuilder copy = builder;
    QCOMPARE(copy.document().toString(-1),
             QStringLiteral("<Config version=\"2\"><Item>a &lt; b<!--note-->\n</Item>"
                            "<Data><![CDATA[x]y]]>t</Data></Config>"));
    QDomElement asDom = root;
    QCOMPARE(asDom.tagName(), QStringLiteral("Config"));

    builder.clear();
    QVERIFY(builder.document().isNull());
    // clear() drops this handle only; the copy keeps the document.
    QCOMPARE(copy.document().documentElement().tagName(), QStringLiteral("Config"));
}

void TestXml::builderWithoutDocument()
{
    ZuXmlBuilder::Element none;
    QVERIFY(none.isNull());
    QVERIFY(none.addChild(QStringLiteral("a")).isNull());
    QVERIFY(none.addChild(QStringLiteral("a"), QStringLiteral("t")).isNull());
    QVERIFY(none.addText(QStringLiteral("t")).isNull());
    QVERIFY(none.addComment(QStringLiteral("c")).isNull());
    QVERIFY(none.addCDATA(QStringLiteral("d")).isNull());
    QVERIFY(none.parent().isNull());
    QVERIFY(none.toQDomElement().isNull());
}

// Steps of a writer script: "S name" start, "X name" aligned start, "A name=value" attribute,
// "E" end, "C text" section comment, "L" empty line, "LX" aligned empty line, "I n" indent,
// "T text" characters.
void TestXml::writerLayout_data()
{
    QTest::addColumn<bool>("autoFormat");
    QTest::addColumn<QStringList>("script");
    QTest::addColumn<QString>("expected");

    QTest::newRow("aligned root") << true << QStringList{"X Root", "A a=1", "A bb=2", "A c=3", "E"}
                                  << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
                                     "<Root a=\"1\"\n"
                                     "      bb=\"2\"\n"
                                     "      c=\"3\"/>\n";
    QTest::newRow("plain start keeps one line")
        << true << QStringList{"S Root", "A a=1", "A bb=2", "A c=3", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
           "<Root a=\"1\" bb=\"2\" c=\"3\"/>\n";
    // The child's start also carried the parent's '>' and the line feed: 12 bytes, 11 blanks.
    QTest::newRow("aligned child")
        << true << QStringList{"S Root", "X Child", "A x=1", "A y=2", "E", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
           "<Root>\n"
           "    <Child x=\"1\"\n"
           "            y=\"2\"/>\n"
           "</Root>\n";
    QTest::newRow("plain start after aligned one")
        << true << QStringList{"X Root", "A a=1", "S Child", "A x=1", "A y=2", "E", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
           "<Root a=\"1\">\n"
           "    <Child x=\"1\" y=\"2\"/>\n"
           "</Root>\n";
    const QString longName(60, QLatin1Char('n'));
    QTest::newRow("indent capped at 40")
        << true << QStringList{"X " + longName, "A a=1", "A b=2", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<" + longName + " a=\"1\"\n" +
               QString(40, QLatin1Char(' ')) + "b=\"2\"/>\n";
    // Root: 3 - 4 + 6 = 5, so the aligned empty line carries 4 blanks, which the next element
    // uses as its indentation (the base writer does not indent after characters).
    QTest::newRow("section comment after aligned start")
        << true << QStringList{"X Root", "A a=1", "C Part one", "S Item", "E", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
           "<Root a=\"1\">\n\n<!--Part one-->\n\n    <Item/>\n"
           "</Root>\n";
    // Without alignment the comment is followed by the indentation of the current depth.
    QTest::newRow("section comment after plain start")
        << true << QStringList{"S Root", "S Group", "C Next", "E", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
           "<Root>\n"
           "    <Group>\n\n<!--Next-->\n\n        </Group>\n"
           "</Root>\n";
    QTest::newRow("empty section comment writes nothing")
        << false << QStringList{"S Root", "C ", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?><Root/>\n";
    // "<Root" took 5 bytes: 3 - 4 + 5 = 4, so 3 blanks.
    QTest::newRow("empty lines and indent")
        << false << QStringList{"X Root", "LX", "L", "I 2", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?><Root\n   \n\n        />\n";
    QTest::newRow("aligned empty line needs aligned start")
        << false << QStringList{"S Root", "LX", "T x", "E"}
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?><Root>x</Root>\n";
}

void TestXml::writerLayout()
{
    QFETCH(bool, autoFormat);
    QFETCH(QStringList, script);
    QFETCH(QString, expected);

    QByteArray out;
    ZuXmlStreamWriter writer(&out);
    writer.setAutoFormatting(autoFormat);
    writer.writeStartDocument();
    for (const QString& step : script) {
        const QString op = step.section(QLatin1Char(' '), 0, 0);
        const QString arg = step.section(QLatin1Char(' '), 1);
        if (op == QLatin1String("S")) {
            writer.writeStartElement(arg);
        } else if (op == QLatin1String("X")) {
            writer.writeStartElementExt(arg);
        } else if (op == QLatin1String("A")) {
            writer.writeAttribute(arg.section(QLatin1Char('='), 0, 0),
                                  arg.section(QLatin1Char('='), 1));
        } else if (op == QLatin1String("E")) {
            writer.writeEndElement();
        } else if (op == QLatin1String("C")) {
            writer.writeSectionComment(arg);
        } else if (op == QLatin1String("L")) {
            writer.writeEmptyLine();
        } else if (op == QLatin1String("LX")) {
            writer.writeEmptyLineExt();
        } else if (op == QLatin1String("I")) {
            writer.indent(arg.toInt());
        } else if (op == QLatin1String("T")) {
            writer.writeCharacters(arg);
        } else {
            QFAIL(qPrintable("bad step " + step));
        }
    }
    writer.writeEndDocument();
    QCOMPARE(QString::fromUtf8(out), expected);
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

void TestXml::textStreamOperators_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("boolValue");
    QTest::addColumn<QUuid>("uuid");
    const QUuid id(QStringLiteral("{6f1a3c2e-1b2d-4e5f-8a9b-0c1d2e3f4a5b}"));
    QTest::newRow("True") << "True" << true << QUuid();
    QTest::newRow("TRUE") << "TRUE" << true << QUuid();
    QTest::newRow("yes is not true") << "yes" << false << QUuid();
    QTest::newRow("padded is not true") << " true" << false << QUuid();
    QTest::newRow("uuid") << id.toString() << false << id;
    QTest::newRow("uuid without braces") << "6f1a3c2e-1b2d-4e5f-8a9b-0c1d2e3f4a5b" << false << id;
}

void TestXml::textStreamOperators()
{
    QFETCH(QString, text);
    QFETCH(bool, boolValue);
    QFETCH(QUuid, uuid);
    QString source = text;
    QTextStream in(&source);
    QString firstWord;
    in >> firstWord; // the readers look at the whole string, not at what is left
    bool readBool = !boolValue;
    QUuid readUuid = QUuid::createUuid();
    in >> readBool;
    in >> readUuid;
    QCOMPARE(readBool, boolValue);
    QCOMPARE(readUuid, uuid);

    QString written;
    QTextStream out(&written);
    const bool yes = true;
    const bool no = false;
    out << yes << ' ' << no << ' ' << uuid;
    out.flush();
    QCOMPARE(written, "true false " + uuid.toString());
}

QTEST_GUILESS_MAIN(TestXml)
#include "tst_xml.moc"
