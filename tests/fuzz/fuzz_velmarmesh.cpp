// Parameter files: any input gives either a bundle of named text parameters or a refusal with
// exactly one record, never a crash.
#include "pnresources/VelmarMesh.h"

#include <cstdint>
#include <cstdlib>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const std::string text(reinterpret_cast<const char*>(inData), inSize);
    RkResult result;
    const std::unique_ptr<VelmarMesh> mesh = VelmarMesh::parse(text, "fuzz", &result);
    if (!mesh != (result.records().size() == 1))
        std::abort();
    if (mesh) {
        for (int i = 0; i < mesh->size(); ++i) {
            const auto* parameter = dynamic_cast<const DvParameter*>((*mesh)[i]);
            // Values never span lines or hold a double quote: a rewrite can quote them again.
            if (!parameter || parameter->getName().isEmpty() ||
                parameter->getString().str().find_first_of("\"\n\r") != std::string::npos)
                std::abort();
        }
    }
    return 0;
}
