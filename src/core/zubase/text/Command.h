#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkDArray.h"
#include "rklib/RkHandle.h"
#include "rklib/RkResult.h"

#include <QString>
#include <QStringList>

namespace ZuBase {

// Base of a host's command-line commands. A command line is a sequence of "--Name" items, each
// followed by "name=value" attributes. Hosts register one factory per name, then hand the
// arguments (without the program name) to parseCommands():
//
//     ZuBase::Command::registerFactory("help", &HelpCommand::create);
//     RkDArray<RkHandle<ZuBase::Command>> commands;
//     if (ZuBase::Command::parseCommands(args, commands).isBad()) ...
class ZUBASE_EXPORT Command : public RkHandable
{
public:
    // One "name=value" attribute of a command; shared between copies of the command.
    class ZUBASE_EXPORT Attribute : public RkHandable
    {
    public:
        Attribute() = default;
        Attribute(const QString& inName, const QString& inValue);

        // The stored texts passed through Command::resolve() at every read.
        QString name() const;
        QString value() const;
        void nameSet(const QString& inName);
        void valueSet(const QString& inValue);

    protected:
        ~Attribute() override;

    private:
        QString mName;
        QString mValue;
    };

    using Factory = RkHandle<Command> (*)();
    using Resolver = RkResult (*)(QString& ioText);

    // Enters a factory under its (case-sensitive) name; a name registered again gets the new one.
    static void registerFactory(const QString& inName, Factory inFactory);
    // Replaces the resolver that rewrites every attribute name and value when it is read.
    static void registerResolver(Resolver inResolver);
    // Success without a resolver; else the resolver's result, ioText rewritten by it.
    static RkResult resolve(QString& ioText);
    // Makes the command registered as inCommandName; a bad result for an unknown name.
    static RkResult create(RkHandle<Command>& outCommand, const QString& inCommandName);
    // Parses "--Name name=value ..." groups; each command's executeEarly() runs as soon as its
    // attributes are attached. On failure outCommands is empty.
    static RkResult parseCommands(const QStringList& inArgs,
                                  RkDArray<RkHandle<Command>>& outCommands);
    // The usage text of one command, or the general usage for an unknown or empty name;
    // inPrint also writes it to standard output.
    static QString usage(const QString& inCommandName, bool inPrint);

    // Appends an attribute; repeats are allowed.
    void attributeAdd(const QString& inName, const QString& inValue);
    // All attributes named inName in their order; an empty name selects all.
    void attributes(RkDArray<RkHandle<Attribute>>& outList, QString inName) const;
    // The first attribute named inName, checking that it occurs exactly once (inExactlyOnce)
    // or at most once. The first match is handed out even when the check fails.
    RkResult attribute1(RkHandle<Attribute>& outAttribute, QString inName,
                        bool inExactlyOnce) const;

    // Runs the command; called by the host, never by this library.
    virtual RkResult execute() = 0;
    // One-line description for the general usage.
    virtual const char* description() const = 0;
    // Full help of the command and its attributes.
    virtual const char* detailedDescription() const = 0;
    // Called by parseCommands() as soon as the attributes are attached; default: success.
    virtual RkResult executeEarly() const;
    // Called by the host after all commands ran, never by this library.
    virtual RkResult finish() = 0;

protected:
    Command();
    // Copies share the attribute objects; each copy has its own reference count.
    Command(const Command& inOther);
    Command& operator=(const Command& inOther);
    ~Command() override;

private:
    RkDArray<RkHandle<Attribute>> mAttributes;
};

} // namespace ZuBase
