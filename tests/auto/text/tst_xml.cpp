// XML helpers: typed DOM attributes, the chained builder, the aligned stream writer and the text
// stream operators.
#include "zubase/ZuDom.h"
#include "zubase/ZuTextStream.h"
#include "zubase/ZuXmlBuilder.h"
#include "zubase/ZuXmlStreamWriter.h"

#include <QBuffer>
#include <QtTest>

static QStringList sWarnings;

class TestXml : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    // Yes and no words in any case, not trimmed; integers split at single blanks, the numbers
    // read until a failure kept.
    void textParsers()
    {
        const QList<QPair<const char*, int>> words = {
            {"TRUE", 1}, {"On", 1},    {"yes", 1}, {"1", 1},      {"0", 0}, {"no", 0},
            {"OFF", 0},  {"False", 0}, {"", -1},   {" true", -1}, {"2", -1}};
        for (const auto& word : words)
            QCOMPARE(ZuDom::qStringToBool(word.first), word.second);
        const QList<QPair<QString, QList<int>>> lists = {
            {"1 -2 3", {1, -2, 3}}, {"", {}}, {"1  2", {1}}, {"1 x 3", {1}}};
        for (const auto& list : lists) {
            QList<int> out{99};
            QCOMPARE(ZuDom::readIntegerListParams(list.first, out), list.first == "1 -2 3");
            QCOMPARE(out, list.second);
        }
    }

    // int, float and bool from attribute "v", starting from -7, -7.5 and true; "!" marks a failed
    // read, which leaves the start value. A null element reads as a missing attribute.
    void typedAttributes()
    {
        const QList<QPair<QString, QString>> cases = {{"12", "12 12 !true"},
                                                      {"0", "0 0 false"},
                                                      {"2.5", "!-7 2.5 !true"},
                                                      {"Off", "!-7 !-7.5 false"},
                                                      {QString(), "!-7 !-7.5 !true"}};
        QDomDocument document;
        for (const auto& c : cases) {
            QDomElement element = c.first.isNull() ? QDomElement() : document.createElement("e");
            ZuDom::setAttribute(element, "v", c.first); // ignored on a null element
            int i = -7;
            float f = -7.5f;
            bool b = true;
            const bool intOk = ZuDom::getAttribute(element, "v", i);
            const bool floatOk = ZuDom::getAttribute(element, "v", f);
            const bool boolOk = ZuDom::getAttribute(element, "v", b);
            QCOMPARE(QString::asprintf("%s%d %s%g %s%s", intOk ? "" : "!", i, floatOk ? "" : "!",
                                       double(f), boolOk ? "" : "!", b ? "true" : "false"),
                     c.second);
        }
    }

    // Copies of the builder share the document; without a builder nothing is added anywhere.
    void builder()
    {
        ZuXmlBuilder builder;
        ZuXmlBuilder::Element root = builder.createRootElement("Config");
        root.setAttribute("version", "2").addChild("Item", "a < b").addComment("note");
        root.addChild("Data").addCDATA("x]y").addText("t");
        ZuXmlBuilder copy = builder;
        builder.clear();
        QVERIFY(builder.document().isNull() && root.parent().isNull());
        QCOMPARE(copy.document().toString(-1),
                 QStringLiteral("<Config version=\"2\"><Item>a &lt; b<!--note-->\n</Item>"
                                "<Data><![CDATA[x]y]]>t</Data></Config>"));
        ZuXmlBuilder::Element none;
        QVERIFY(none.addChild("a", "t").isNull() && none.addComment("c").isNull() &&
                none.addCDATA("d").isNull() && none.parent().isNull());
    }

    // Steps of a writer script, split at "|": "S name" start, "X name" aligned start, "A
    // name=value" attribute, "E" end, "C text" section comment, "L" empty line, "Y" aligned
    // empty line, "I n" indent, "N n" auto-formatting indent. Modes: 0 plain, 1
    // auto-formatting, 2 on a closed device.
    void writerLayout_data()
    {
        QTest::addColumn<int>("mode");
        QTest::addColumn<QString>("script");
        QTest::addColumn<QString>("expected"); // what follows the XML declaration
        auto row = [](const char* inName, int inMode, const QString& inScript,
                      const QString& inExpected) {
            QTest::newRow(inName) << inMode << inScript << inExpected;
        };
        row("aligned root", 1, "X Root|A a=1|A bb=2|A c=3|E",
            "\n<Root a=\"1\"\n      bb=\"2\"\n      c=\"3\"/>\n");
        // The child's start also carried the parent's '>' and the line feed: 12 bytes, 11 blanks.
        row("aligned child", 1, "S Root|X Child|A x=1|A y=2|E|E",
            "\n<Root>\n    <Child x=\"1\"\n            y=\"2\"/>\n</Root>\n");
        row("plain start after aligned one", 1, "X Root|A a=1|S Child|A x=1|A y=2|E|E",
            "\n<Root a=\"1\">\n    <Child x=\"1\" y=\"2\"/>\n</Root>\n");
        const QString longName(60, 'n');
        row("indent capped at 40", 1, "X " + longName + "|A a=1|A b=2|E",
            "\n<" + longName + " a=\"1\"\n" + QString(40, ' ') + "b=\"2\"/>\n");
        // Root: 3 - 4 + 6 = 5, so the aligned empty line carries 4 blanks, which the next
        // element uses as its indentation (the base writer does not indent after characters).
        row("section comment after aligned start", 1, "X Root|A a=1|C Part one|S Item|E|E",
            "\n<Root a=\"1\">\n\n<!--Part one-->\n\n    <Item/>\n</Root>\n");
        // After a plain start: no aligned empty line, an empty comment is nothing, and a comment
        // is followed by the indentation of the current depth.
        row("section comment after plain start", 1, "S Root|S Group|Y|C |C Next|E|E",
            "\n<Root>\n    <Group>\n\n<!--Next-->\n\n        </Group>\n</Root>\n");
        // "<Root" took 5 bytes: 3 - 4 + 5 = 4, so 3 blanks. Tabs count one blank per step.
        row("empty lines and indent", 0, "X Root|Y|L|I 2|N -1|I 3|E",
            "<Root\n   \n\n        \n   />\n");
        // The base writer gives up after its first failed write; the layout writes nothing.
        row("closed device", 2, "X Root|A a=1|A b=2|L|Y|I 3|C c|E", "");
    }
    void writerLayout()
    {
        QFETCH(int, mode);
        QFETCH(QString, script);
        QByteArray out;
        QBuffer closed(&out);
        ZuXmlStreamWriter open(&out);
        ZuXmlStreamWriter onClosed(&closed);
        ZuXmlStreamWriter& writer = mode == 2 ? onClosed : open;
        writer.setAutoFormatting(mode == 1);
        sWarnings.clear();
        const QtMessageHandler previous =
            qInstallMessageHandler([](QtMsgType, const QMessageLogContext&, const QString& inText) {
                sWarnings << inText;
            });
        writer.writeStartDocument();
        for (const QString& step : script.split('|')) {
            const QString arg = step.mid(2);
            // clang-format off
            switch (step.at(0).toLatin1()) {
            case 'S': writer.writeStartElement(arg); break;
            case 'X': writer.writeStartElementExt(arg); break;
            case 'A': writer.writeAttribute(arg.section('=', 0, 0), arg.section('=', 1)); break;
            case 'E': writer.writeEndElement(); break;
            case 'C': writer.writeSectionComment(arg); break;
            case 'L': writer.writeEmptyLine(); break;
            case 'Y': writer.writeEmptyLineExt(); break;
            case 'I': writer.indent(arg.toInt()); break;
            case 'N': writer.setAutoFormattingIndent(arg.toInt()); break;
            }
            // clang-format on
        }
        writer.writeEndDocument();
        qInstallMessageHandler(previous);
        QTEST(QString::fromUtf8(out).section('>', 1), "expected");
        const QString notOpen = "QIODevice::write (QBuffer): device not open";
        QCOMPARE(sWarnings, mode == 2 ? QStringList(notOpen) : QStringList());
    }

    // The readers take the whole string of the stream, not what is left of it.
    void textStreamOperators()
    {
        const QUuid id("{6f1a3c2e-1b2d-4e5f-8a9b-0c1d2e3f4a5b}");
        QString text = "True", uuidText = id.toString(), word, written;
        bool flag = false;
        QUuid readId;
        QTextStream(&text) >> word >> flag;
        QTextStream(&uuidText) >> word >> readId;
        QVERIFY(flag && readId == id);
        QTextStream out(&written);
        out << true << ' ' << false << ' ' << id;
        out.flush();
        QCOMPARE(written, "true false " + id.toString());
    }
};

QTEST_GUILESS_MAIN(TestXml)
#include "tst_xml.moc"
