#pragma once

#include "zubase/Command.h"

// The demo host's commands: --help [command=NAME], --scheme name=NAME, --screenshot file=PATH,
// --quit.
namespace DemoCommands {

// Registers the commands with ZuBase::Command.
void registerAll();

} // namespace DemoCommands

// --help [command=NAME]: prints the general usage or that of one command.
class HelpCommand : public ZuBase::Command
{
public:
    static RkHandle<ZuBase::Command> make();
    RkResult execute() override;
    const char* description() const override;
    const char* detailedDescription() const override;
    RkResult finish() override { return RkResult(); }
};

// --screenshot file=PATH: writes the main window to a PNG file and quits.
class ScreenshotCommand : public ZuBase::Command
{
public:
    static RkHandle<ZuBase::Command> make();
    RkResult execute() override { return RkResult(); }
    const char* description() const override;
    const char* detailedDescription() const override;
    RkResult finish() override { return RkResult(); }
    // The file named by the "file" attribute.
    QString fileName(RkResult& outResult) const;
};

// --quit: closes the window right after showing it (for scripted runs).
class QuitCommand : public ZuBase::Command
{
public:
    static RkHandle<ZuBase::Command> make();
    RkResult execute() override { return RkResult(); }
    const char* description() const override;
    const char* detailedDescription() const override;
    RkResult finish() override { return RkResult(); }
};

// --scheme name=NAME: the colour scheme to start with (default "Tessel Light").
class SchemeCommand : public ZuBase::Command
{
public:
    static RkHandle<ZuBase::Command> make();
    RkResult execute() override { return RkResult(); }
    const char* description() const override;
    const char* detailedDescription() const override;
    RkResult finish() override { return RkResult(); }
    // The scheme named by the "name" attribute.
    QString schemeName(RkResult& outResult) const;
};
