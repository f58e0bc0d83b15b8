// Stands in for the control program: writes its arguments, one per line, to the file named by
// ZU_TZCONTROL_RECORD (through a temporary file, so that a reader never sees half of it).
#include <cstdio>
#include <cstdlib>
#include <string>

int main(int argc, char** argv)
{
    const char* record = std::getenv("ZU_TZCONTROL_RECORD");
    if (!record)
        return 2;
    const std::string temporary = std::string(record) + ".part";
    FILE* file = std::fopen(temporary.c_str(), "wb");
    if (!file)
        return 3;
    for (int i = 1; i < argc; ++i)
        std::fprintf(file, "%s\n", argv[i]);
    std::fclose(file);
    return std::rename(temporary.c_str(), record) == 0 ? 0 : 4;
}
