// Command lines: the input split at line feeds is the argument list. Parsing never crashes, a
// failure leaves no commands, and every attribute has a name without "=".
#include "zubase/Command.h"

#include "rklib/RkLogFile.h"

#include <cstdint>
#include <cstdlib>

namespace {

class FuzzCommand : public ZuBase::Command
{
public:
    RkResult execute() override { return RkResult(); }
    RkResult finish() override { return RkResult(); }
    const char* description() const override { return "A command."; }
    const char* detailedDescription() const override { return "    x=VALUE\n"; }
};

RkHandle<ZuBase::Command> make()
{
    return new FuzzCommand;
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    getTheLogInstance().setOutputLevel(RkLogOff); // failures are expected by the thousand
    ZuBase::Command::registerFactory("A", &make);
    ZuBase::Command::registerFactory("help", &make);
    ZuBase::Command::registerFactory("Null", [] { return RkHandle<ZuBase::Command>(); });
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(inData), int(inSize));
    const QStringList args = text.split(QLatin1Char('\n'));
    RkDArray<RkHandle<ZuBase::Command>> commands;
    const RkResult res = ZuBase::Command::parseCommands(args, commands);
    if (res.isBad() && commands.size() != 0)
        std::abort();
    for (const RkHandle<ZuBase::Command>& command : commands) {
        RkDArray<RkHandle<ZuBase::Command::Attribute>> all;
        command->attributes(all, QString());
        for (const auto& attribute : all) {
            if (attribute->name().isEmpty() || attribute->name().contains(QLatin1Char('=')))
                std::abort();
            RkHandle<ZuBase::Command::Attribute> first;
            command->attribute1(first, attribute->name(), false);
            if (first.isNull())
                std::abort();
        }
    }
    ZuBase::Command::usage(args.first(), false);
    return 0;
}
