// Command-line commands: parsing, failure records, attribute access and usage texts.
#include "zubase/Command.h"

#include "TestSupport.h"

#include "rklib/RkLogFile.h"

#include <QtTest>

namespace {

QStringList sEvents; // what the test commands saw, in order

class TestCommand : public ZuBase::Command
{
public:
    explicit TestCommand(const char* inName) : mName(inName)
    {
        sEvents << QStringLiteral("create %1").arg(mName);
    }
    RkResult execute() override { return RkResult(); }
    const char* description() const override { return mDescription; }
    const char* detailedDescription() const override { return "    x=VALUE   an attribute\n"; }
    RkResult executeEarly() const override
    {
        RkDArray<RkHandle<Attribute>> all;
        attributes(all, QString());
        QStringList pairs;
        for (const auto& attribute : all)
            pairs << attribute->name() + '=' + attribute->value();
        sEvents << QStringLiteral("early %1 [%2]").arg(mName, pairs.join(','));
        return RkResult();
    }
    RkResult finish() override { return RkResult(); }

    const char* mName;
    const char* mDescription = "Test command.";
};

RkHandle<ZuBase::Command> makeA()
{
    return new TestCommand("A");
}
RkHandle<ZuBase::Command> makeB()
{
    return new TestCommand("B");
}
RkHandle<ZuBase::Command> makeHelp()
{
    auto* command = new TestCommand("help");
    command->mDescription = "Prints the usage.";
    return command;
}

RkResult upperCaseResolver(QString& ioText)
{
    ioText = ioText.toUpper();
    return RkResult();
}

QString commandSummary(const RkDArray<RkHandle<ZuBase::Command>>& inCommands)
{
    QStringList parts;
    for (const auto& command : inCommands) {
        RkDArray<RkHandle<ZuBase::Command::Attribute>> all;
        command->attributes(all, QString());
        QStringList pairs;
        for (const auto& attribute : all)
            pairs << attribute->name() + '=' + attribute->value();
        parts << QString::fromLatin1(static_cast<TestCommand*>(command.get())->mName) + '(' +
                     pairs.join(',') + ')';
    }
    return parts.join(' ');
}

const QString sWhere = QStringLiteral("src/core/zubase/Command:ZuBase::Command::");

using TestSupport::failureLines;

} // namespace

class TestCommandLine : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void init();
    void parse_data();
    void parse();
    void executeEarlyRunsBeforeNextCommandIsRead();
    void failedParseEmptiesListAfterEarlyCalls();
    void attribute1_data();
    void attribute1();
    void resolverRewritesEveryRead();
    void copiesShareAttributes();
    void commandUsage();
    void generalUsage();
    void nullFactory();
    void hostileArguments();
};

void TestCommandLine::initTestCase()
{
    ZuBase::Command::registerFactory("A", &makeA);
    ZuBase::Command::registerFactory("B", &makeB);
    ZuBase::Command::registerFactory("help", &makeHelp);
}

void TestCommandLine::init()
{
    sEvents.clear();
    ZuBase::Command::registerResolver(nullptr);
}

void TestCommandLine::parse_data()
{
    QTest::addColumn<QStringList>("args");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QString>("commands");
    QTest::addColumn<QStringList>("failures");

    QTest::newRow("empty") << QStringList() << true << "" << QStringList();
    QTest::newRow("two commands") << QStringList{"--A", "x=1", "--B", "y=2"} << true
                                  << "A(x=1) B(y=2)" << QStringList();
    QTest::newRow("repeats kept in order")
        << QStringList{"--A", "x=1", "x=2", "--A"} << true << "A(x=1,x=2) A()" << QStringList();
    QTest::newRow("inner quotes kept")
        << QStringList{"--A", "x=\"p q\""} << true << "A(x=\"p q\")" << QStringList();
    QTest::newRow("outer quotes dropped")
        << QStringList{"--A", "\"x=p q\""} << true << "A(x=p q)" << QStringList();
    QTest::newRow("escaped quotes")
        << QStringList{"--A", "\"a=\\\"b\\\"\""} << true << "A(a=\"b\")" << QStringList();
    QTest::newRow("trimmed") << QStringList{"  --A ", "\tx=1 "} << true << "A(x=1)"
                             << QStringList();
    QTest::newRow("empty value") << QStringList{"--A", "name="} << true << "A(name=)"
                                 << QStringList();
    QTest::newRow("value with equal signs")
        << QStringList{"--A", "a=b=c"} << true << "A(a=b=c)" << QStringList();
    QTest::newRow("single quote char") << QStringList{"--A", "\""} << false << ""
                                       << QStringList{sWhere + "parseCommands: parse error near "
                                                               "'\"'  cond[posOfEqualSign>0]"};
    QTest::newRow("attribute first")
        << QStringList{"a=b"} << false << ""
        << QStringList{sWhere + "parseCommands: parse error near 'a=b'  val[-1]  exp[0]"};
    QTest::newRow("dashes inside")
        << QStringList{"x--y"} << false << ""
        << QStringList{sWhere + "parseCommands: parse error near 'x--y'  val[1]  exp[0]"};
    QTest::newRow("dashes alone")
        << QStringList{"--"} << false << ""
        << QStringList{sWhere + "create: Internal Error  "
                                "cond[sListOfFactory.contains(Q2M(inCommandName))]",
                       sWhere + "parseCommands: unknown command ''  cond[command.isNotNull()]"};
    QTest::newRow("case sensitive")
        << QStringList{"--Help"} << false << ""
        << QStringList{sWhere + "create: Internal Error  "
                                "cond[sListOfFactory.contains(Q2M(inCommandName))]",
                       sWhere + "parseCommands: unknown command 'Help'  cond[command.isNotNull()]"};
    QTest::newRow("empty item as attribute")
        << QStringList{"--A", "\"\""} << false << ""
        << QStringList{sWhere + "parseCommands: parse error near ''  cond[posOfEqualSign>0]"};
    QTest::newRow("no value")
        << QStringList{"--A", "name"} << false << ""
        << QStringList{sWhere + "parseCommands: parse error near 'name'  cond[posOfEqualSign>0]"};
    QTest::newRow("no name")
        << QStringList{"--A", "=value"} << false << ""
        << QStringList{sWhere + "parseCommands: parse error near '=value'  cond[posOfEqualSign>0]"};
    QTest::newRow("stops at first error")
        << QStringList{"--A", "bad", "--Nope"} << false << ""
        << QStringList{sWhere + "parseCommands: parse error near 'bad'  cond[posOfEqualSign>0]"};
}

void TestCommandLine::parse()
{
    QFETCH(QStringList, args);
    QFETCH(bool, ok);
    QFETCH(QString, commands);
    QFETCH(QStringList, failures);

    RkLogCapture capture;
    RkDArray<RkHandle<ZuBase::Command>> parsed;
    parsed.append(RkHandle<ZuBase::Command>(makeA())); // must be emptied first
    const RkResult res = ZuBase::Command::parseCommands(args, parsed);
    QCOMPARE(res.isOk(), ok);
    QCOMPARE(commandSummary(parsed), commands);
    QCOMPARE(failureLines(capture), failures);
    // Failures are reported, not handed back as records.
    QVERIFY(res.records().empty());
}

void TestCommandLine::executeEarlyRunsBeforeNextCommandIsRead()
{
    RkDArray<RkHandle<ZuBase::Command>> parsed;
    QVERIFY(ZuBase::Command::parseCommands({"--A", "x=1", "--B", "y=2"}, parsed).isOk());
    QCOMPARE(sEvents, QStringList({"create A", "early A [x=1]", "create B", "early B [y=2]"}));
}

void TestCommandLine::failedParseEmptiesListAfterEarlyCalls()
{
    RkDArray<RkHandle<ZuBase::Command>> parsed;
    QVERIFY(ZuBase::Command::parseCommands({"--A", "x=1", "--B", "oops"}, parsed).isBad());
    QCOMPARE(parsed.size(), 0);
    // A's early call happened; B's did not, since its attribute failed.
    QCOMPARE(sEvents, QStringList({"create A", "early A [x=1]", "create B"}));
}

void TestCommandLine::attribute1_data()
{
    QTest::addColumn<QStringList>("attributes");
    QTest::addColumn<bool>("exactlyOnce");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QString>("handedOut");
    QTest::addColumn<QString>("failure");

    QTest::newRow("once, exactly") << QStringList{"k=1"} << true << true << "1"
                                   << "";
    QTest::newRow("missing, exactly")
        << QStringList{"other=1"} << true << false << ""
        << sWhere + "attribute1: The attribute 'k' must occur exactly once.  val[0]  exp[1]";
    QTest::newRow("twice, exactly")
        << QStringList{"k=1", "k=2"} << true << false << "1"
        << sWhere + "attribute1: The attribute 'k' must occur exactly once.  val[2]  exp[1]";
    QTest::newRow("missing, optional") << QStringList{} << false << true << ""
                                       << "";
    QTest::newRow("once, optional") << QStringList{"k=v"} << false << true << "v"
                                    << "";
    QTest::newRow("twice, optional")
        << QStringList{"k=first", "k=second"} << false << false << "first"
        << sWhere +
               "attribute1: The attribute 'k' must not occur more than once.  cond[arr.size()<2]";
    QTest::newRow("case sensitive name") << QStringList{"K=1"} << false << true << ""
                                         << "";
}

void TestCommandLine::attribute1()
{
    QFETCH(QStringList, attributes);
    QFETCH(bool, exactlyOnce);
    QFETCH(bool, ok);
    QFETCH(QString, handedOut);
    QFETCH(QString, failure);

    RkHandle<ZuBase::Command> command = makeA();
    for (const QString& pair : attributes)
        command->attributeAdd(pair.section('=', 0, 0), pair.section('=', 1));
    RkLogCapture capture;
    RkHandle<ZuBase::Command::Attribute> found(new ZuBase::Command::Attribute);
    const RkResult res = command->attribute1(found, "k", exactlyOnce);
    QCOMPARE(res.isOk(), ok);
    QCOMPARE(found.isNotNull(), !handedOut.isEmpty());
    if (found.isNotNull())
        QCOMPARE(found->value(), handedOut);
    QCOMPARE(failureLines(capture), failure.isEmpty() ? QStringList() : QStringList{failure});
}

void TestCommandLine::resolverRewritesEveryRead()
{
    RkHandle<ZuBase::Command> command = makeA();
    command->attributeAdd("key", "value");
    RkDArray<RkHandle<ZuBase::Command::Attribute>> list;
    command->attributes(list, "key");
    QCOMPARE(list.size(), 1);
    ZuBase::Command::registerResolver(&upperCaseResolver);
    QCOMPARE(list[0]->name(), QStringLiteral("KEY"));
    QCOMPARE(list[0]->value(), QStringLiteral("VALUE"));
    // Lookup compares the resolved name.
    command->attributes(list, "key");
    QCOMPARE(list.size(), 0);
    ZuBase::Command::registerResolver(nullptr);
    QCOMPARE(list.size(), 0);
    command->attributes(list, "key");
    QCOMPARE(list[0]->value(), QStringLiteral("value")); // stored text never changed
}

void TestCommandLine::copiesShareAttributes()
{
    TestCommand original("A");
    original.attributeAdd("k", "1");
    TestCommand copy(original);
    QCOMPARE(copy.refCount(), 0);
    RkDArray<RkHandle<ZuBase::Command::Attribute>> a;
    RkDArray<RkHandle<ZuBase::Command::Attribute>> b;
    original.attributes(a, "k");
    copy.attributes(b, "k");
    QVERIFY(a[0] == b[0]);
    a[0]->valueSet("2");
    QCOMPARE(b[0]->value(), QStringLiteral("2"));
}

void TestCommandLine::commandUsage()
{
    QCOMPARE(ZuBase::Command::usage("A", false),
             QStringLiteral("\n--A\n\n    Test command.\n\n    x=VALUE   an attribute\n\n"));
}

void TestCommandLine::generalUsage()
{
    RkLogCapture capture;
    const QString expected = QStringLiteral(
        "\n"
        "Usage: program.exe { '--'Command {Attribute} }\n"
        "\n"
        "       Command : A | B | help\n"
        "\n"
        "       Attribute : [\"][attributeName'=']attributeValue[\"]\n"
        "\n"
        "           If the values contain whitespaces, the whole attribute must\n"
        "           be enclosed with quotes.\n"
        "           Quotes in the value must be escaped with a backslash ( \\\" ).\n"
        "\n"
        "\n"
        "   Possible commands are:\n"
        "\n   --A\n\n       Test command.\n"
        "\n   --B\n\n       Test command.\n"
        "\n   --help\n\n       Prints the usage.\n"
        "\n"
        "\n"
        "   To get detailed information for a command (like for example 'mycommand')\n"
        "   use:\n"
        "\n"
        "       > program.exe --help command=mycommand\n");
    QCOMPARE(ZuBase::Command::usage(QString(), false), expected);
    QCOMPARE(ZuBase::Command::usage("nope", false), expected);
    // Both unknown names were reported by create.
    QCOMPARE(failureLines(capture).size(), 2);
}

void TestCommandLine::nullFactory()
{
    ZuBase::Command::registerFactory("Null", [] { return RkHandle<ZuBase::Command>(); });
    RkLogCapture capture;
    RkHandle<ZuBase::Command> command;
    QVERIFY(ZuBase::Command::create(command, "Null").isBad());
    QVERIFY(command.isNull());
    QCOMPARE(failureLines(capture),
             QStringList{sWhere + "create: Internal Error  cond[outCommand.isNotNull()]"});
    // The general usage still lists it instead of crashing.
    QVERIFY(ZuBase::Command::usage(QString(), false).contains("A | B | Null | help"));
    ZuBase::Command::registerFactory("Null", &makeB); // registering again replaces
    QVERIFY(ZuBase::Command::create(command, "Null").isOk());
    QCOMPARE(QString(static_cast<TestCommand*>(command.get())->mName), QStringLiteral("B"));
}

void TestCommandLine::hostileArguments()
{
    QByteArray binary(4096, '\0');
    for (int i = 0; i < binary.size(); ++i)
        binary[i] = char(i * 7);
    const QStringList inputs[] = {
        {QString::fromLatin1(binary)},
        {"--A", QString(1 << 20, 'x') + "=" + QString(1 << 20, 'y')},
        {"--A", QString::fromLatin1(binary) + "=1"},
        {"--A", "\"\\\"", "--", "\"\"\"\""},
        {QString(100000, '-')},
    };
    for (const QStringList& args : inputs) {
        RkDArray<RkHandle<ZuBase::Command>> parsed;
        const RkResult res = ZuBase::Command::parseCommands(args, parsed);
        if (res.isBad())
            QCOMPARE(parsed.size(), 0);
    }
    RkDArray<RkHandle<ZuBase::Command>> parsed;
    QVERIFY(ZuBase::Command::parseCommands({"--A", QString(1 << 20, 'x') + "=v"}, parsed).isOk());
    QCOMPARE(parsed.size(), 1);
}

QTEST_GUILESS_MAIN(TestCommandLine)
#include "tst_command.moc"
