#include "pnresources/PnResourceLayer.h"

#include "rklib/RkCheck.h"
#include "rklib/RkLogFile.h"
#include "rklib/Tz.h"

#include <cstdlib>
#include <pwd.h>
#include <string>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

namespace {

struct LayerState
{
    std::string root;
    RkFilename registryPath;
    DvParamBundle bundle;
    bool webServiceEnabled = false;
    std::string webServiceHost;
    std::string webServiceLoginName;
    std::string userName;
    bool userNameKnown = false;
    std::string localDirectory;
    std::string volumeDirectory;
    RkString startupDirectory;
};

LayerState& state()
{
    static LayerState instance;
    return instance;
}

bool isDirectory(const std::string& inPath)
{
    struct stat info = {};
    return !inPath.empty() && ::stat(inPath.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

bool isTrue(const std::string& inText)
{
    return inText == "1" || inText == "true";
}

} // namespace

namespace PnClientConfig {
bool sStartedViaTzClient = false;
} // namespace PnClientConfig

namespace PnResource {

const char* const defaultLocalDirName = "local";

const char* getRoot()
{
    return state().root.c_str();
}

void setApplicationFolder(const char* inFolder)
{
    state().root = inFolder ? inFolder : "";
}

const RkFilename& registryFilePath()
{
    return state().registryPath;
}

void registryFilePathSet(const char* inPath)
{
    state().registryPath = RkFilename(inPath ? inPath : "");
}

DvParamBundle& registryBundle()
{
    return state().bundle;
}

void clearRegistryBundle()
{
    state().bundle.clear();
}

void readFromBundle(const DvParamBundle& inBundle)
{
    LayerState& s = state();
    // Copy first: inBundle may be registryBundle() itself.
    std::vector<std::unique_ptr<DvParamBase>> copies;
    for (int i = 0; i < inBundle.size(); ++i) {
        if (const auto* parameter = dynamic_cast<const DvParameter*>(inBundle[i]))
            copies.push_back(
                std::make_unique<DvParameter>(parameter->getName(), parameter->getString()));
    }
    s.bundle.clear();
    for (auto& entry : copies) {
        const auto& parameter = static_cast<const DvParameter&>(*entry);
        const std::string& name = parameter.getName().str();
        const std::string& value = parameter.getString().str();
        if (name == "LocalDirectory")
            s.localDirectory = value;
        else if (name == "VolumeDirectory")
            s.volumeDirectory = value;
        else if (name == "WebServiceEnabled")
            s.webServiceEnabled = isTrue(value);
        else if (name == "WebServiceHost")
            s.webServiceHost = value;
        else if (name == "WebServiceLoginName")
            s.webServiceLoginName = value;
        s.bundle.add(std::move(entry));
    }
}

void setWebServiceEnabled(bool inEnabled)
{
    state().webServiceEnabled = inEnabled;
}

bool isWebServiceEnabled()
{
    return state().webServiceEnabled;
}

void setWebServiceHost(const char* inHost)
{
    state().webServiceHost = inHost ? inHost : "";
}

const char* getWebServiceHost()
{
    return state().webServiceHost.c_str();
}

void setWebServiceLoginName(const char* inName)
{
    state().webServiceLoginName = inName ? inName : "";
}

const char* getWebServiceLoginName()
{
    return state().webServiceLoginName.c_str();
}

const char* getUserName()
{
    LayerState& s = state();
    if (!s.userNameKnown) {
        std::vector<char> buffer(16384);
        passwd entry = {};
        passwd* found = nullptr;
        if (::getpwuid_r(::geteuid(), &entry, buffer.data(), buffer.size(), &found) == 0 && found)
            s.userName = found->pw_name;
        else if (const char* user = std::getenv("USER"))
            s.userName = user;
        s.userNameKnown = true;
    }
    return s.userName.c_str();
}

void setLocalDirectoryNonExplicit(const char* inPath)
{
    state().localDirectory = inPath ? inPath : "";
}

const char* getLocalDirectory()
{
    return state().localDirectory.c_str();
}

void setVolumeDirectory(const char* inPath)
{
    state().volumeDirectory = inPath ? inPath : "";
}

const char* getVolumeDirectory()
{
    return state().volumeDirectory.c_str();
}

RkResult checkDirectories()
{
    RkResult res;
    const std::string& local = state().localDirectory;
    const std::string& volume = state().volumeDirectory;
    res << RK_CHECK(isDirectory(local), "isDirectory(local)",
                    "Local directory " + local + " not found.");
    if (volume != local)
        res << RK_CHECK(isDirectory(volume), "isDirectory(volume)",
                        "Volume directory " + volume + " not found.");
    return res;
}

void handleError(const char* inText)
{
    getTheLogInstance().warnf("%s", inText ? inText : "");
}

void handleError(const RkResult& inResult)
{
    Tz::fail(inResult);
}

const RkString& processStartupDirectory()
{
    return state().startupDirectory;
}

void processStartupDirectorySet(const char* inPath)
{
    state().startupDirectory = RkString(inPath ? inPath : "");
}

const char* getOrganizationName()
{
    return "Pernel";
}

const char* getApplicationRegistryName()
{
    return "Tessel";
}

const char* getApplicationTesselLocalName()
{
    return "Tessel";
}

} // namespace PnResource
