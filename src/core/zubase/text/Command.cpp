#include "zubase/Command.h"

#include "zubase/ZuCheck_p.h"

#include <QCoreApplication>

#include <cstdio>
#include <map>
#include <mutex>

namespace ZuBase {

namespace {

// The registry of factories, keyed by the 8-bit command name. Ordered by name, so the general
// usage lists the commands in a stable order.
struct Registry
{
    std::mutex mutex;
    std::map<RkString, Command::Factory> sListOfFactory;
    Command::Resolver sResolver = nullptr;
};

Registry& registry()
{
    static Registry* const instance = new Registry;
    return *instance;
}

RkString keyOf(const QString& inName)
{
    return RkString(Q2M(inName).toStdString());
}

Command::Factory factoryOf(const QString& inName)
{
    Registry& r = registry();
    std::lock_guard<std::mutex> lock(r.mutex);
    const auto found = r.sListOfFactory.find(keyOf(inName));
    return found == r.sListOfFactory.end() ? nullptr : found->second;
}

QString tr(const char* inText)
{
    return QCoreApplication::translate("ZuBase::Command", inText);
}

// Drops the quotes around an item that is quoted as a whole and unescapes \" inside it.
QString normalised(const QString& inItem)
{
    QString item = inItem.trimmed();
    if (item.size() >= 2 && item.startsWith(QLatin1Char('"')) && item.endsWith(QLatin1Char('"'))) {
        item = item.mid(1, item.size() - 2);
        item.replace(QLatin1String("\\\""), QLatin1String("\""));
    }
    return item;
}

const char* const kGeneralUsage =
    "\n"
    "Usage: %1 { '--'Command {Attribute} }\n"
    "\n"
    "       Command : %2\n"
    "\n"
    "       Attribute : [\"][attributeName'=']attributeValue[\"]\n"
    "\n"
    "           If the values contain whitespaces, the whole attribute must\n"
    "           be enclosed with quotes.\n"
    "           Quotes in the value must be escaped with a backslash ( \\\" ).\n"
    "\n"
    "\n"
    "   Possible commands are:\n"
    "%3\n"
    "\n"
    "   To get detailed information for a command (like for example 'mycommand')\n"
    "   use:\n"
    "\n"
    "       > %1 --help command=mycommand\n";

} // namespace

Command::Attribute::Attribute(const QString& inName, const QString& inValue)
    : mName(inName), mValue(inValue)
{}

Command::Attribute::~Attribute() = default;

QString Command::Attribute::name() const
{
    QString text = mName;
    Command::resolve(text);
    return text;
}

QString Command::Attribute::value() const
{
    QString text = mValue;
    Command::resolve(text);
    return text;
}

void Command::Attribute::nameSet(const QString& inName)
{
    mName = inName;
}

void Command::Attribute::valueSet(const QString& inValue)
{
    mValue = inValue;
}

Command::Command() = default;

Command::Command(const Command& inOther) : RkHandable(inOther), mAttributes(inOther.mAttributes) {}

Command& Command::operator=(const Command& inOther)
{
    mAttributes = inOther.mAttributes;
    return *this;
}

Command::~Command() = default;

void Command::registerFactory(const QString& inName, Factory inFactory)
{
    Registry& r = registry();
    std::lock_guard<std::mutex> lock(r.mutex);
    r.sListOfFactory[keyOf(inName)] = inFactory;
}

void Command::registerResolver(Resolver inResolver)
{
    Registry& r = registry();
    std::lock_guard<std::mutex> lock(r.mutex);
    r.sResolver = inResolver;
}

RkResult Command::resolve(QString& ioText)
{
    Resolver resolver = nullptr;
    {
        Registry& r = registry();
        std::lock_guard<std::mutex> lock(r.mutex);
        resolver = r.sResolver;
    }
    RkResult res;
    if (resolver)
        res << resolver(ioText);
    return res;
}

RkResult Command::create(RkHandle<Command>& outCommand, const QString& inCommandName)
{
    RkResult res;
    outCommand.clear();
    const Factory factory = factoryOf(inCommandName);
    // The recorded condition text is part of the record: it names the registry lookup.
    ZU_CHECK_RETURN(res, RK_CHECK(factory != nullptr, "sListOfFactory.contains(Q2M(inCommandName))",
                                  "Internal Error"));
    outCommand = factory();
    ZU_CHECK_RETURN(res,
                    RK_CHECK(outCommand.isNotNull(), "outCommand.isNotNull()", "Internal Error"));
    return res;
}

RkResult Command::parseCommands(const QStringList& inArgs, RkDArray<RkHandle<Command>>& outCommands)
{
    RkResult res;
    outCommands.clear();
    QStringList items;
    items.reserve(inArgs.size());
    for (const QString& arg : inArgs)
        items.append(normalised(arg));

    // Collected apart, so that a failure anywhere hands back no commands at all.
    RkDArray<RkHandle<Command>> parsed;
    const QString dashes = QStringLiteral("--");
    int next = 0;
    while (next < items.size()) {
        const QString& item = items.at(next++);
        const int posOfDashes = item.indexOf(dashes);
        ZU_CHECK_RETURN(res, RK_CHECK_EQ(posOfDashes, 0, tr("parse error near '%1'").arg(item)));
        const QString name = item.mid(2);
        RkHandle<Command> command;
        create(command, name); // reports an unknown name itself
        ZU_CHECK_RETURN(res, RK_CHECK(command.isNotNull(), "command.isNotNull()",
                                      tr("unknown command '%1'").arg(name)));
        parsed.append(command);

        while (next < items.size() && !items.at(next).startsWith(dashes)) {
            const QString& attribute = items.at(next++);
            const int posOfEqualSign = attribute.indexOf(QLatin1Char('='));
            ZU_CHECK_RETURN(res, RK_CHECK(posOfEqualSign > 0, "posOfEqualSign>0",
                                          tr("parse error near '%1'").arg(attribute)));
            command->attributeAdd(attribute.left(posOfEqualSign),
                                  attribute.mid(posOfEqualSign + 1));
        }
        command->executeEarly();
    }
    outCommands = parsed;
    return res;
}

QString Command::usage(const QString& inCommandName, bool inPrint)
{
    QString text;
    RkHandle<Command> command;
    create(command, inCommandName);
    if (command.isNotNull()) {
        text = QStringLiteral("\n--%1\n\n    %2\n\n%3\n")
                   .arg(inCommandName, QString::fromLatin1(command->description()),
                        QString::fromLatin1(command->detailedDescription()));
    } else {
        std::vector<std::pair<RkString, Factory>> entries;
        {
            Registry& r = registry();
            std::lock_guard<std::mutex> lock(r.mutex);
            entries.assign(r.sListOfFactory.begin(), r.sListOfFactory.end());
        }
        QStringList names;
        QString blocks;
        for (const auto& entry : entries) {
            const QString name = QString::fromLocal8Bit(entry.first.c_str());
            const RkHandle<Command> made = entry.second ? entry.second() : RkHandle<Command>();
            // A factory that returns nothing still gets its name listed.
            const QString description =
                made.isNotNull() ? QString::fromLatin1(made->description()) : QString();
            names.append(name);
            blocks += QStringLiteral("\n   --%1\n\n       %2\n").arg(name, description);
        }
        text = QString::fromLatin1(kGeneralUsage)
                   .arg(QStringLiteral("program.exe"), names.join(QStringLiteral(" | ")), blocks);
    }
    if (inPrint) {
        const QByteArray bytes = '\n' + text.toLocal8Bit() + '\n';
        std::fwrite(bytes.constData(), 1, std::size_t(bytes.size()), stdout);
        std::fflush(stdout);
    }
    return text;
}

void Command::attributeAdd(const QString& inName, const QString& inValue)
{
    mAttributes.append(RkHandle<Attribute>(new Attribute(inName, inValue)));
}

void Command::attributes(RkDArray<RkHandle<Attribute>>& outList, QString inName) const
{
    outList.clear();
    for (const RkHandle<Attribute>& attribute : mAttributes) {
        if (inName.isEmpty() || attribute->name() == inName)
            outList.append(attribute);
    }
}

RkResult Command::attribute1(RkHandle<Attribute>& outAttribute, QString inName,
                             bool inExactlyOnce) const
{
    RkResult res;
    outAttribute.clear();
    RkDArray<RkHandle<Attribute>> matches;
    attributes(matches, inName);
    // The first match is handed out even when the count is wrong.
    if (matches.size() > 0)
        outAttribute = matches[0];
    if (inExactlyOnce) {
        ZU_CHECK_RETURN(res,
                        RK_CHECK_EQ(matches.size(), 1,
                                    tr("The attribute '%1' must occur exactly once.").arg(inName)));
    } else {
        // The recorded condition text is part of the record and stays "arr.size()<2".
        ZU_CHECK_RETURN(
            res, RK_CHECK(matches.size() < 2, "arr.size()<2",
                          tr("The attribute '%1' must not occur more than once.").arg(inName)));
    }
    return res;
}

RkResult Command::executeEarly() const
{
    return RkResult();
}

} // namespace ZuBase
