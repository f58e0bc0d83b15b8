#pragma once

#include "zubase/Command.h"

// The demo host's commands: --help [command=NAME], --scheme name=NAME, --screenshot file=PATH,
// --quit.
namespace DemoCommands {

// Registers the commands with ZuBase::Command.
void registerAll();
// The names registered, in the order of the usage text.
QStringList names();

} // namespace DemoCommands

// Base of the demo's commands: fixed help texts, nothing to run unless a command says otherwise.
class DemoCommand : public ZuBase::Command
{
public:
    DemoCommand(const char* inDescription, const char* inDetails)
        : mDescription(inDescription), mDetails(inDetails)
    {}
    RkResult execute() override { return RkResult(); }
    const char* description() const override { return mDescription; }
    const char* detailedDescription() const override { return mDetails; }
    RkResult finish() override { return RkResult(); }

protected:
    // The value of the attribute inName (checked to occur exactly once, or at most once).
    QString value(const char* inName, bool inExactlyOnce, RkResult& outResult) const;

private:
    const char* mDescription;
    const char* mDetails;
};

// --help [command=NAME]: prints the general usage or that of one command.
class HelpCommand : public DemoCommand
{
public:
    HelpCommand();
    RkResult execute() override;
};

// --screenshot file=PATH: writes the main window to a PNG file and quits.
class ScreenshotCommand : public DemoCommand
{
public:
    ScreenshotCommand();
    QString fileName(RkResult& outResult) const { return value("file", true, outResult); }
};

// --quit: closes the window right after showing it (for scripted runs).
class QuitCommand : public DemoCommand
{
public:
    QuitCommand();
};

// --scheme name=NAME: the colour scheme to start with (default "Tessel Light").
class SchemeCommand : public DemoCommand
{
public:
    SchemeCommand();
    QString schemeName(RkResult& outResult) const { return value("name", true, outResult); }
};
