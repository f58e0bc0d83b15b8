// Test helper installed as "pkexec" in a directory of its own: stands for the system's elevation
// tool. With ZU_FAKE_PKEXEC_DECLINE set it refuses like a dismissed prompt (exit 126); otherwise
// it does what the real tool does after a granted request: it marks its descriptors above 2
// close-on-exec and replaces itself with the program, looked up in PATH when relative.
#include <cstdlib>

#include <fcntl.h>
#include <unistd.h>

int main(int argc, char** argv)
{
    if (argc < 2 || std::getenv("ZU_FAKE_PKEXEC_DECLINE"))
        return 126;
    for (int fd = 3; fd < 1024; ++fd)
        fcntl(fd, F_SETFD, FD_CLOEXEC);
    execvp(argv[1], argv + 1);
    return 127;
}
