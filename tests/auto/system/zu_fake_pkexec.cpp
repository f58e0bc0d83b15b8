// Test helper installed as "pkexec" in a directory of its own: stands for the system's elevation
// tool. With ZU_FAKE_PKEXEC_DECLINE set it refuses like a dismissed prompt (exit 126); otherwise
// it replaces itself with the program, as the real tool does after a granted request.
#include <cstdlib>

#include <unistd.h>

int main(int argc, char** argv)
{
    if (argc < 2 || std::getenv("ZU_FAKE_PKEXEC_DECLINE"))
        return 126;
    execv(argv[1], argv + 1);
    return 127;
}
