#include "DemoCommands.h"

namespace {

template <typename T> RkHandle<ZuBase::Command> make()
{
    return new T;
}

const struct
{
    const char* name;
    ZuBase::Command::Factory factory;
} kCommands[] = {{"help", &make<HelpCommand>},
                 {"screenshot", &make<ScreenshotCommand>},
                 {"quit", &make<QuitCommand>},
                 {"scheme", &make<SchemeCommand>}};

} // namespace

namespace DemoCommands {

void registerAll()
{
    for (const auto& command : kCommands)
        ZuBase::Command::registerFactory(QLatin1String(command.name), command.factory);
}

QStringList names()
{
    QStringList result;
    for (const auto& command : kCommands)
        result << QLatin1String(command.name);
    return result;
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
