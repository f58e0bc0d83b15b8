// Stands in for the control program: writes its arguments, one per line, to the file named by
// ZU_TZCONTROL_RECORD.
#include <cstdio>
#include <cstdlib>

int main(int argc, char** argv)
{
    const char* record = std::getenv("ZU_TZCONTROL_RECORD");
    FILE* file = record ? std::fopen(record, "wb") : nullptr;
    if (!file)
        return 2;
    for (int i = 1; i < argc; ++i)
        std::fprintf(file, "%s\n", argv[i]);
    return std::fclose(file) == 0 ? 0 : 3;
}
