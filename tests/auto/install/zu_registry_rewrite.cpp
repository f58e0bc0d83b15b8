// Starts an installation and lists its other versions with a file-size limit, as on a full
// disk: zu_registry_rewrite <application folder> <limit in bytes> <own protocol version>.
// The log goes to standard error.
#include "zubase/PnResource.h"

#include <QCoreApplication>

#include <csignal>
#include <cstdlib>
#include <sys/resource.h>

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    if (argc != 4)
        return 2;
    // Writes beyond the limit then fail with EFBIG instead of ending the process.
    std::signal(SIGXFSZ, SIG_IGN);
    const rlim_t limit = std::strtoull(argv[2], nullptr, 10);
    const rlimit fileSize = {limit, limit};
    if (setrlimit(RLIMIT_FSIZE, &fileSize) != 0)
        return 3;
    PnResource::initialize(argv[1], nullptr);
    std::map<RkVersion, std::string> versions;
    PnResource::getOtherVersions(versions, RkVersion(argv[3]));
    return 0;
}
