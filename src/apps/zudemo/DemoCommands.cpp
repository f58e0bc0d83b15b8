#include "DemoCommands.h"

namespace DemoCommands {

void registerAll()
{
    ZuBase::Command::registerFactory(QStringLiteral("help"), &HelpCommand::make);
    ZuBase::Command::registerFactory(QStringLiteral("screenshot"), &ScreenshotCommand::make);
    ZuBase::Command::registerFactory(QStringLiteral("quit"), &QuitCommand::make);
    ZuBase::Command::registerFactory(QStringLiteral("scheme"), &SchemeCommand::make);
}

} // namespace DemoCommands

RkHandle<ZuBase::Command> HelpCommand::make()
{
    return new HelpCommand;
}

RkResult HelpCommand::execute()
{
    RkHandle<Attribute> command;
    const RkResult res = attribute1(command, QStringLiteral("command"), false);
    ZuBase::Command::usage(command.isNotNull() ? command->value() : QString(), true);
    return res;
}

const char* HelpCommand::description() const
{
    return "Prints this text, or the help of one command.";
}

const char* HelpCommand::detailedDescription() const
{
    return "    command=NAME   the command to describe (optional)\n";
}

RkHandle<ZuBase::Command> ScreenshotCommand::make()
{
    return new ScreenshotCommand;
}

const char* ScreenshotCommand::description() const
{
    return "Writes the main window to a PNG file and quits.";
}

const char* ScreenshotCommand::detailedDescription() const
{
    return "    file=PATH      the PNG file to write (required)\n";
}

QString ScreenshotCommand::fileName(RkResult& outResult) const
{
    RkHandle<Attribute> file;
    outResult = attribute1(file, QStringLiteral("file"), true);
    return file.isNotNull() ? file->value() : QString();
}

RkHandle<ZuBase::Command> QuitCommand::make()
{
    return new QuitCommand;
}

const char* QuitCommand::description() const
{
    return "Closes the window right after it was shown.";
}

const char* QuitCommand::detailedDescription() const
{
    return "    (no attributes)\n";
}

RkHandle<ZuBase::Command> SchemeCommand::make()
{
    return new SchemeCommand;
}

const char* SchemeCommand::description() const
{
    return "Starts with the given colour scheme.";
}

const char* SchemeCommand::detailedDescription() const
{
    return "    name=NAME      the scheme's name, e.g. \"Tessel Dark\" (required)\n";
}

QString SchemeCommand::schemeName(RkResult& outResult) const
{
    RkHandle<Attribute> name;
    outResult = attribute1(name, QStringLiteral("name"), true);
    return name.isNotNull() ? name->value() : QString();
}
