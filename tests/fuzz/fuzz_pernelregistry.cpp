// The installation registry: any file is read or refused, and an update of its OtherVersion
// lines leaves a file that reads back with the same other parameters, beside a backup of the
// old one; a second update changes nothing.
#include "pnresources/VelmarMesh.h"
#include "rklib/RkLogFile.h"
#include "zubase/PnResource.h"

#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <sys/stat.h>

namespace {

std::string sRoot;

std::string readFile(const std::string& inPath)
{
    std::ifstream in(inPath, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), {});
}

// The parameters other than the OtherVersion entries; "-" for a refused file.
std::string otherParameters(const std::string& inText)
{
    const std::unique_ptr<VelmarMesh> mesh = VelmarMesh::parse(inText, "fuzz", nullptr);
    std::string text = mesh ? "" : "-";
    for (int i = 0; mesh && i < mesh->size(); ++i) {
        const auto* parameter = dynamic_cast<const DvParameter*>((*mesh)[i]);
        if (parameter->getName().str().compare(0, 12, "OtherVersion") != 0)
            text += parameter->getName().str() + "=" + parameter->getString().str() + "\n";
    }
    return text;
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
    std::atexit([]() { std::filesystem::remove_all(sRoot); });
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const std::string input(reinterpret_cast<const char*>(inData), inSize);
    const std::string registry = sRoot + "/share/dicom/PernelRegistry";
    std::ofstream(registry, std::ios::binary | std::ios::trunc) << input;
    std::remove((registry + ".bak").c_str());
    PnResource::initialize(sRoot.c_str(), nullptr);
    std::map<RkVersion, std::string> versions;
    PnResource::getOtherVersions(versions, RkVersion("8.0"));
    const std::string written = readFile(registry);
    if (written != input &&
        (otherParameters(input) == "-" || otherParameters(written) != otherParameters(input) ||
         readFile(registry + ".bak") != input))
        std::abort();
    PnResource::getOtherVersions(versions, RkVersion("8.0"));
    if (readFile(registry) != written)
        std::abort();
    return 0;
}
