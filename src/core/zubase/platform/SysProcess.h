#pragma once

// Internal platform layer of ZuBase::Process: the system work of starting, watching and ending
// processes. Qt-free; every call returns 0 or an errno-style code that the caller turns into
// its failure record. Handles are small numbers owned by this layer; InvalidHandle marks none.

#include <cstdint>
#include <string>
#include <vector>

namespace ZuPlatform {

using Handle = std::intptr_t;
constexpr Handle InvalidHandle = -1;
// Exit code reported for a process that has not ended yet.
constexpr int StillActive = 259;

// What creating a child gives back: a process handle, a handle of its main thread and ids.
struct ProcessCreation
{
    Handle process = 0;
    Handle thread = 0;
    unsigned processId = 0;
    unsigned threadId = 0;
};

// Splits a command line into arguments with the rules of the Windows C runtime: blanks and tabs
// separate, double quotes group, backslashes escape only in front of a double quote, and the
// program name takes quotes without escapes.
std::vector<std::string> splitCommandLine(const std::string& inCommandLine);

// Parses a block of "NAME=value\0" entries ended by an empty entry.
std::vector<std::string> environmentEntries(const char* inBlock);

// Creates a child from a command line, suspended: the child stops itself before it loads the
// program and runs only after resumeThread(). inEnvironmentBlock null inherits ours; an empty
// inWorkingDirectory keeps ours. The child gets no standard streams and none of our descriptors.
int createProcessSuspended(const std::string& inCommandLine, const char* inEnvironmentBlock,
                           const std::string& inWorkingDirectory, ProcessCreation& outCreation);
// Lets a suspended child run; outPreviousCount is 1 for a suspended child, else 0.
int resumeThread(Handle inThread, int& outPreviousCount);

// Opens a process: inFullAccess for querying its end and terminating it, else for reading its
// modules and image name. Fails for a process that is gone or that we may not touch.
int openProcess(unsigned inProcessId, bool inFullAccess, Handle& outProcess);
// StillActive while the process runs, else its exit code.
int exitCodeProcess(Handle inProcess, int& outExitCode);
// Kills the process; a child of ours then reports inExitCode as its exit code.
int terminateProcess(Handle inProcess, int inExitCode);
int closeHandle(Handle inHandle);

// Every process id of the machine, in the order the system lists them.
int enumProcesses(std::vector<unsigned>& outIds);
// The files mapped as code into the process (executable and shared libraries), each once, in
// the order of their first mapping.
int processModules(Handle inProcess, std::vector<std::string>& outPaths);
// The executable of the process.
int processImageFileName(Handle inProcess, std::string& outPath);
unsigned currentProcessId();

// Starts inFile with inArguments through the system's elevation tool (pkexec, looked up in PATH).
// Returns once the tool has let the program start or has refused it; a missing tool gives
// ENOENT, a refused or declined request EACCES.
int shellExecuteElevated(const std::string& inFile, const std::vector<std::string>& inArguments);

// elevated: the effective user is root; admin: root or a member of sudo, wheel or admin.
void elevationInfo(bool& outElevated, bool& outAdmin);

} // namespace ZuPlatform
