// Replays fuzz inputs without libFuzzer: every file named on the command line, and every file
// in every folder named there, in name order, goes once through LLVMFuzzerTestOneInput.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <dirent.h>
#include <fstream>
#include <iterator>
#include <string>
#include <sys/stat.h>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize);
extern "C" __attribute__((weak)) int LLVMFuzzerInitialize(int* ioArgc, char*** ioArgv);

namespace {

void collect(const std::string& inPath, std::vector<std::string>& outFiles)
{
    struct stat info = {};
    if (stat(inPath.c_str(), &info) != 0)
        return;
    if (!S_ISDIR(info.st_mode)) {
        outFiles.push_back(inPath);
        return;
    }
    if (DIR* dir = opendir(inPath.c_str())) {
        std::vector<std::string> names;
        while (const dirent* entry = readdir(dir)) {
            if (entry->d_name[0] != '.')
                names.push_back(inPath + "/" + entry->d_name);
        }
        closedir(dir);
        std::sort(names.begin(), names.end());
        for (const std::string& name : names)
            collect(name, outFiles);
    }
}

} // namespace

int main(int argc, char** argv)
{
    if (LLVMFuzzerInitialize)
        LLVMFuzzerInitialize(&argc, &argv);
    std::vector<std::string> files;
    for (int i = 1; i < argc; ++i)
        collect(argv[i], files);
    if (files.empty()) {
        std::fprintf(stderr, "no inputs found\n");
        return 1;
    }
    for (const std::string& file : files) {
        std::ifstream in(file, std::ios::binary);
        const std::vector<char> bytes((std::istreambuf_iterator<char>(in)),
                                      std::istreambuf_iterator<char>());
        LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size());
    }
    std::printf("replayed %zu input(s)\n", files.size());
    return 0;
}
