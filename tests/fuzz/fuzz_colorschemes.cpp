// The colour-scheme reader: each input is written to a file and read with addStyle(); a scheme
// it stores is switched to and asked for its colours, then dropped again so that a long run
// does not fill the table.
#include "zubase/ZuApplication.h"
#include "zubase/ZuStyleFactory.h"
#include "zubase/styles/ZuStyleFactory_p.h"

#include "rklib/RkLogFile.h"

#include <QFile>
#include <QTemporaryDir>

#include <cstdint>
#include <memory>

namespace {

std::unique_ptr<QTemporaryDir> sDir;

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    static int argc = 1;
    static char name[] = "fuzz_colorschemes";
    static char* argv[] = {name, nullptr};
    ZuApplication::createInstance(argc, argv, nullptr);
    getTheLogInstance().setOutputLevel(RkLogOff); // every rejected file warns
    sDir = std::make_unique<QTemporaryDir>();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const QString path = sDir->filePath(QStringLiteral("scheme.xml"));
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate))
        return 0;
    file.write(reinterpret_cast<const char*>(inData), qint64(inSize));
    file.close();
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    if (!factory.addStyle(path))
        return 0;
    factory.setCurrentStyle(factory.styleNames().value(0));
    factory.userDefinedColor(QStringLiteral("Panel"), Qt::red);
    factory.currentStyleIsTesselNative();
    factory.currentStyleIsOSNative();
    ZuStyleFactoryPrivate* d = ZuStyleFactoryPrivate::get(factory);
    d->schemes.clear();
    d->currentName.clear();
    return 0;
}
