// The installation registry: any file is read or refused, and when its OtherVersion lines are
// brought up to date the new file reads back with the same other parameters, and a second
// update changes nothing.
#include "pnresources/PnResourceLayer.h"
#include "pnresources/VelmarMesh.h"
#include "rklib/RkLogFile.h"
#include "zubase/PnResource.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

namespace {

std::string sRoot;

std::string registryPath()
{
    return sRoot + "/share/dicom/PernelRegistry";
}

std::string readFile(const std::string& inPath)
{
    std::ifstream in(inPath, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), {});
}

// The parameters other than the OtherVersion entries, as "name=value" lines.
std::string otherParameters(const VelmarMesh& inMesh)
{
    std::string text;
    for (int i = 0; i < inMesh.size(); ++i) {
        const auto* parameter = dynamic_cast<const DvParameter*>(inMesh[i]);
        if (parameter->getName().str().compare(0, 12, "OtherVersion") != 0)
            text += parameter->getName().str() + "=" + parameter->getString().str() + "\n";
    }
    return text;
}

void removeBackups()
{
    const std::string base = registryPath() + ".bak";
    std::remove(base.c_str());
    for (int n = 2; n < 10; ++n)
        std::remove((base + std::to_string(n)).c_str());
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    char folder[] = "/tmp/zu_fuzz_registry_XXXXXX";
    if (!mkdtemp(folder))
        std::abort();
    sRoot = folder;
    for (const char* sub : {"/share", "/share/dicom", "/local"})
        mkdir((sRoot + sub).c_str(), 0700);
    getTheLogInstance().setOutputLevel(RkLogOff);
    std::atexit([]() {
        removeBackups();
        for (const char* sub :
             {"/share/dicom/PernelRegistry", "/share/dicom", "/share", "/local", ""})
            std::remove((sRoot + sub).c_str());
    });
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const std::string input(reinterpret_cast<const char*>(inData), inSize);
    {
        std::ofstream out(registryPath(), std::ios::binary | std::ios::trunc);
        out << input;
    }
    removeBackups();
    PnResource::initialize(sRoot.c_str(), nullptr);
    const std::unique_ptr<VelmarMesh> before = VelmarMesh::parse(input, "fuzz", nullptr);

    std::map<RkVersion, std::string> versions;
    PnResource::getOtherVersions(versions, RkVersion("8.0"));
    const std::string written = readFile(registryPath());
    if (written == input)
        return 0;
    if (!before)
        std::abort(); // a refused file was changed
    const std::unique_ptr<VelmarMesh> after = VelmarMesh::parse(written, "fuzz", nullptr);
    if (!after || otherParameters(*after) != otherParameters(*before) ||
        readFile(registryPath() + ".bak") != input)
        std::abort();
    PnResource::getOtherVersions(versions, RkVersion("8.0"));
    if (readFile(registryPath()) != written)
        std::abort();
    return 0;
}
