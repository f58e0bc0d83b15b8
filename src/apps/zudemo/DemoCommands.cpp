#include "DemoCommands.h"

namespace {

template <typename T> RkHandle<ZuBase::Command> make()
{
    return new T;
}

} // namespace

namespace DemoCommands {

void registerAll()
{
    ZuBase::Command::registerFactory(QStringLiteral("help"), &make<HelpCommand>);
    ZuBase::Command::registerFactory(QStringLiteral("screenshot"), &make<ScreenshotCommand>);
    ZuBase::Command::registerFactory(QStringLiteral("quit"), &make<QuitCommand>);
    ZuBase::Command::registerFactory(QStringLiteral("scheme"), &make<SchemeCommand>);
}

} // namespace DemoCommands

QString DemoCommand::value(const char* inName, bool inExactlyOnce, RkResult& outResult) const
{
    RkHandle<Attribute> attribute;
    outResult = attribute1(attribute, QString::fromLatin1(inName), inExactlyOnce);
    return attribute.isNotNull() ? attribute->value() : QString();
}

HelpCommand::HelpCommand()
    : DemoCommand("Prints this text, or the help of one command.",
                  "    command=NAME   the command to describe (optional)\n")
{}

RkResult HelpCommand::execute()
{
    RkResult res;
    const QString command = value("command", false, res);
    ZuBase::Command::usage(command, true);
    return res;
}

ScreenshotCommand::ScreenshotCommand()
    : DemoCommand("Writes the main window to a PNG file and quits.",
                  "    file=PATH      the PNG file to write (required)\n")
{}

QuitCommand::QuitCommand()
    : DemoCommand("Closes the window right after it was shown.", "    (no attributes)\n")
{}

SchemeCommand::SchemeCommand()
    : DemoCommand("Starts with the given colour scheme.",
                  "    name=NAME      the scheme's name, e.g. \"Tessel Dark\" (required)\n")
{}
