// A host built outside the tree against an installed zubase.
#include <zubase/Command.h>

#include <cstdio>

namespace {
class Hello : public ZuBase::Command
{
public:
    static RkHandle<ZuBase::Command> make() { return new Hello; }
    RkResult execute() override { return RkResult(); }
    const char* description() const override { return "says hello"; }
    const char* detailedDescription() const override { return "no attributes"; }
    RkResult finish() override { return RkResult(); }
};
} // namespace

int main(int argc, char** argv)
{
    ZuBase::Command::registerFactory(QStringLiteral("hello"), &Hello::make);
    QStringList args;
    for (int i = 1; i < argc; ++i)
        args << QString::fromLocal8Bit(argv[i]);
    RkDArray<RkHandle<ZuBase::Command>> commands;
    const RkResult res = ZuBase::Command::parseCommands(args, commands);
    std::printf("parsed %d command(s), %s\n", commands.size(), res.isOk() ? "ok" : "bad");
    return res.isOk() && commands.size() == 1 ? 0 : 1;
}
