// Stands in for another installation's server executable. Copied into a test installation as
// tzserver.exe, it writes its arguments to <itself>.args, reads its standard input to the end
// (a probe that leaves it open gets nothing), prints <itself>.out and, when <itself>.hang
// exists, does not end.
#include <cstdio>
#include <fstream>
#include <iostream>
#include <iterator>
#include <string>
#include <unistd.h>

int main(int argc, char** argv)
{
    char buffer[4096];
    const ssize_t length = readlink("/proc/self/exe", buffer, sizeof buffer);
    const std::string self(buffer, std::size_t(length > 0 ? length : 0));
    std::ofstream args(self + ".args");
    for (int i = 1; i < argc; ++i)
        args << argv[i] << '\n';
    args.close();
    while (std::fread(buffer, 1, sizeof buffer, stdin) > 0) {
    }
    std::ifstream output(self + ".out", std::ios::binary);
    std::cout << std::string(std::istreambuf_iterator<char>(output), {}) << std::flush;
    if (std::ifstream(self + ".hang").good())
        sleep(60);
    return 0;
}
