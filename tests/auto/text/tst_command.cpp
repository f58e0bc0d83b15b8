// Command-line commands: parsing with its failure records, attribute access and usage texts.
#include "zubase/Command.h"

#include "TestSupport.h"

#include <unistd.h>

namespace {

QStringList sEarly; // the commands whose executeEarly() ran, in order

class TestCommand : public ZuBase::Command
{
public:
    explicit TestCommand(const char* inName) : mName(inName) {}
    RkResult execute() override { return RkResult(); }
    RkResult finish() override { return RkResult(); }
    const char* description() const override { return "Test command."; }
    const char* detailedDescription() const override { return "    x=VALUE   an attribute\n"; }
    RkResult executeEarly() const override
    {
        sEarly << summary();
        return RkResult();
    }
    QString summary() const // "A(x=1,y=2)"
    {
        RkDArray<RkHandle<Attribute>> all;
        attributes(all, QString());
        QStringList pairs;
        for (const auto& attribute : all)
            pairs << attribute->name() + '=' + attribute->value();
        return mName + '(' + pairs.join(',') + ')';
    }
    QString mName;
};

template <char... inName> RkHandle<ZuBase::Command> make()
{
    static const char name[] = {inName..., '\0'};
    return new TestCommand(name);
}

// The failure records a call reported, one per line, without the common where-prefix.
QString failures(const RkLogCapture& inCapture)
{
    return TestSupport::failureLines(inCapture).join('\n').remove(
        "src/core/zubase/Command:ZuBase::Command::");
}

const QString kUnknown =
    "create: Internal Error  cond[sListOfFactory.contains(Q2M(inCommandName))]";

} // namespace

class TestCommandLine : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase()
    {
        ZuBase::Command::registerFactory("A", &make<'A'>);
        ZuBase::Command::registerFactory("B", &make<'B'>);
        ZuBase::Command::registerFactory("Null", [] { return RkHandle<ZuBase::Command>(); });
    }

    // Items split at "|"; the commands run early (and handed out unless a record is reported).
    void parse_data()
    {
        QTest::addColumn<QString>("args");
        QTest::addColumn<QString>("early");
        QTest::addColumn<QString>("failures");
        const QString near = "parseCommands: parse error near '";
        const QString equalSign = "'  cond[posOfEqualSign>0]";
        // clang-format off
        QTest::newRow("empty") << "" << "" << "";
        QTest::newRow("two commands, trimmed") << "  --A |\tx=1 |--B|y=2" << "A(x=1) B(y=2)" << "";
        QTest::newRow("repeats, empty value, equal signs") << "--A|x=1|x=|a=b=c|--A" << "A(x=1,x=,a=b=c) A()" << "";
        // Only an item quoted as a whole loses its quotes, and only there \" is unescaped.
        QTest::newRow("quotes") << "--A|x=\"p q\"|\"y=p q\"|\"a=\\\"b\\\"\"" << "A(x=\"p q\",y=p q,a=\"b\")" << "";
        QTest::newRow("empty item") << "--A|\"\"" << "" << near + equalSign;
        QTest::newRow("no name") << "--A|=value" << "" << near + "=value" + equalSign;
        QTest::newRow("attribute first") << "a=b" << "" << near + "a=b'  val[-1]  exp[0]";
        QTest::newRow("dashes inside") << "x--y" << "" << near + "x--y'  val[1]  exp[0]";
        QTest::newRow("dashes alone") << "--" << "" << kUnknown + "\nparseCommands: unknown command ''  cond[command.isNotNull()]";
        // Stops at the first error; earlier commands are dropped although they ran early.
        QTest::newRow("late failure") << "--A|x=1|--B|name|--Nope" << "A(x=1)" << near + "name" + equalSign;
        // clang-format on
    }
    void parse()
    {
        QFETCH(QString, args);
        QFETCH(QString, early);
        QFETCH(QString, failures);
        RkLogCapture capture;
        RkDArray<RkHandle<ZuBase::Command>> parsed;
        parsed.append(make<'A'>()); // must be emptied first
        sEarly.clear();
        const RkResult res = ZuBase::Command::parseCommands(
            args.isEmpty() ? QStringList() : args.split('|'), parsed);
        QStringList commands;
        for (const auto& command : parsed)
            commands << static_cast<const TestCommand*>(command.get())->summary();
        QCOMPARE(sEarly.join(' '), early);
        QCOMPARE(commands.join(' '), failures.isEmpty() ? early : QString());
        QCOMPARE(::failures(capture), failures);
        QCOMPARE(res.isOk(), failures.isEmpty());
        QVERIFY(res.records().empty()); // reported, not handed back
    }

    // Counts checked for "k"; the first match is handed out even when the count is wrong.
    void attribute1_data()
    {
        QTest::addColumn<QString>("attributes");
        QTest::addColumn<bool>("exactlyOnce");
        QTest::addColumn<QString>("handedOut"); // empty: none
        QTest::addColumn<QString>("failure");
        const QString exactly = "attribute1: The attribute 'k' must occur exactly once.  ";
        QTest::newRow("once, exactly") << "k=1" << true << "1" << QString();
        QTest::newRow("missing, exactly") << "x=1" << true << "" << exactly + "val[0]  exp[1]";
        QTest::newRow("twice, exactly") << "k=1|k=2" << true << "1" << exactly + "val[2]  exp[1]";
        QTest::newRow("once, optional, case sensitive") << "k=v|K=w" << false << "v" << QString();
        QTest::newRow("twice, optional")
            << "k=first|k=second" << false << "first"
            << "attribute1: The attribute 'k' must not occur more than once.  cond[arr.size()<2]";
    }
    void attribute1()
    {
        QFETCH(QString, attributes);
        QFETCH(bool, exactlyOnce);
        QFETCH(QString, failure);
        TestCommand command("A");
        for (const QString& pair : attributes.split('|'))
            command.attributeAdd(pair.section('=', 0, 0), pair.section('=', 1));
        RkLogCapture capture;
        RkHandle<ZuBase::Command::Attribute> found(new ZuBase::Command::Attribute);
        QCOMPARE(command.attribute1(found, "k", exactlyOnce).isOk(), failure.isEmpty());
        QTEST(found.isNotNull() ? found->value() : QString(), "handedOut");
        QCOMPARE(failures(capture), failure);
    }

    // The resolver rewrites every read, lookups included; the stored text stays.
    void resolver()
    {
        TestCommand command("A");
        command.attributeAdd("key", "value");
        ZuBase::Command::registerResolver([](QString& ioText) {
            ioText = ioText.toUpper();
            return RkResult();
        });
        RkHandle<ZuBase::Command::Attribute> attribute;
        const QString summary = command.summary();
        const bool found =
            command.attribute1(attribute, "key", false).isOk() && attribute.isNotNull();
        ZuBase::Command::registerResolver(nullptr);
        QVERIFY(!found && summary == "A(KEY=VALUE)");
        QVERIFY_OK(command.attribute1(attribute, "key", true));
        QCOMPARE(attribute->value(), QStringLiteral("value"));
    }

    // The general usage names every command, also one whose factory returns nothing, which
    // create() reports; one command's text is printed between two line feeds.
    void usage()
    {
        RkLogCapture capture;
        RkHandle<ZuBase::Command> command;
        QVERIFY(ZuBase::Command::create(command, "Null").isBad() && command.isNull());
        const QString general = ZuBase::Command::usage("nope", false);
        QCOMPARE(failures(capture),
                 "create: Internal Error  cond[outCommand.isNotNull()]\n" + kUnknown);
        QVERIFY(general.contains("\n       Command : A | B | Null\n"));
        QVERIFY(
            general.contains("commands are:\n\n   --A\n\n       Test command.\n\n   --B\n\n       "
                             "Test command.\n\n   --Null\n\n       \n\n\n   To get"));
        const QString detail = "\n--A\n\n    Test command.\n\n    x=VALUE   an attribute\n\n";
        QTemporaryFile out;
        QVERIFY(out.open());
        const int saved = dup(fileno(stdout));
        fflush(stdout);
        dup2(out.handle(), fileno(stdout));
        const QString text = ZuBase::Command::usage("A", true);
        dup2(saved, fileno(stdout));
        close(saved);
        QCOMPARE(text, detail);
        QVERIFY(out.seek(0));
        QCOMPARE(QString::fromLocal8Bit(out.readAll()), '\n' + detail + '\n');
    }
};

QTEST_GUILESS_MAIN(TestCommandLine)
#include "tst_command.moc"
