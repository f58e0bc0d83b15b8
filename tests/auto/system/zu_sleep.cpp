// Test helper: zu_sleep <milliseconds> [exit code] — sleeps, then exits with the code.
#include <cstdlib>

#include <unistd.h>

int main(int argc, char** argv)
{
    const long ms = argc > 1 ? std::atol(argv[1]) : 0;
    if (ms > 0)
        usleep(static_cast<useconds_t>(ms) * 1000);
    return argc > 2 ? std::atoi(argv[2]) : 0;
}
