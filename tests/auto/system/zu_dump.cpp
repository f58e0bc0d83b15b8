// Test helper: zu_dump <output file> <exit code> [arguments...]
// Writes its working directory, arguments, environment and which standard descriptors are open
// (or lead to /dev/null) to the output file (complete or not at all), then exits with the code.
#include <cstdio>
#include <cstdlib>
#include <string>

#include <fcntl.h>
#include <unistd.h>

extern char** environ;

int main(int argc, char** argv)
{
    // Before anything opens a descriptor that could take a free standard number.
    std::string fds;
    for (int fd = 0; fd < 3; ++fd) {
        char target[64] = {};
        const std::string link = "/proc/self/fd/" + std::to_string(fd);
        const bool null = readlink(link.c_str(), target, sizeof target - 1) > 0 &&
                          std::string(target) == "/dev/null";
        fds += std::to_string(fd) + (fcntl(fd, F_GETFD) == -1 ? ":closed "
                                     : null                   ? ":null "
                                                              : ":open ");
    }
    if (argc < 3)
        return 2;
    const std::string target = argv[1];
    const std::string partial = target + ".partial";
    FILE* out = std::fopen(partial.c_str(), "w");
    if (!out)
        return 3;
    char cwd[4096] = {};
    if (!getcwd(cwd, sizeof cwd))
        cwd[0] = '\0';
    std::fprintf(out, "cwd\t%s\n", cwd);
    std::fprintf(out, "fds\t%s\n", fds.c_str());
    for (int i = 3; i < argc; ++i)
        std::fprintf(out, "arg\t%s\n", argv[i]);
    for (char** entry = environ; *entry; ++entry)
        std::fprintf(out, "env\t%s\n", *entry);
    std::fclose(out);
    std::rename(partial.c_str(), target.c_str());
    return std::atoi(argv[2]);
}
