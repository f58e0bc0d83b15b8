#pragma once

// Internal platform layer of ZuBase::Process: the system work of starting, watching and ending
// processes. Qt-free; every call returns 0 or an errno-style code that the caller turns into
// its failure record.

#include "zubase/platform/SysTypes.h"

#include <string>
#include <vector>

namespace ZuPlatform {

// Exit code reported for a process that has not ended yet (STILL_ACTIVE).
constexpr int kStillActive = 259;

// What creating a child gives back: a process handle, a handle of its main thread and its id.
struct ProcessCreation
{
    Handle process = kNullHandle;
    Handle thread = kNullHandle;
    unsigned processId = 0;
};

// Creates a child from a command line (Windows rules, WinCommandLine.h), suspended: the child
// stops itself before it loads the program and runs only after resumeThread(). The program is
// the file the command line names, relative to the current folder, never looked up in PATH.
// inEnvironmentBlock null inherits ours; an empty inWorkingDirectory keeps ours. The child gets
// no standard streams and none of our descriptors. (A Win32 backend passes CREATE_NO_WINDOW |
// DETACHED_PROCESS | CREATE_SUSPENDED and a STARTUPINFO of size 68 on "winsta0\\default".)
int createProcessSuspended(const std::string& inCommandLine, const char* inEnvironmentBlock,
                           const std::string& inWorkingDirectory, ProcessCreation& outCreation);
// Lets a suspended child run; outPreviousCount is 1 for a suspended child, else 0.
int resumeThread(Handle inThread, int& outPreviousCount);

// Opens a process: inFullAccess for querying its end and terminating it, else for reading its
// modules and image name. Fails for a process that is gone or that we may not touch.
int openProcess(unsigned inProcessId, bool inFullAccess, Handle& outProcess);
// kStillActive while the process runs, else its exit code.
int exitCodeProcess(Handle inProcess, int& outExitCode);
// Whether the process has ended (WaitForSingleObject without waiting): a process may end with
// the code kStillActive itself.
int processEnded(Handle inProcess, bool& outEnded);
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
// How many of our children the backend still keeps: those a handle or an unfinished wait holds.
std::size_t childrenTracked();

// Starts inFile (relative to the current folder, never looked up in PATH) with inArguments
// through the system's elevation tool, /usr/bin/pkexec. Returns once the tool has started the
// program or has ended without: a missing tool gives ENOENT, a refused or declined request
// EACCES. The start is seen when the tool's descriptors close on exec, so it does not depend
// on process names, and what the program does afterwards does not change the answer.
int shellExecuteElevated(const std::string& inFile, const std::vector<std::string>& inArguments);
// Another elevation tool that behaves as pkexec does (tests use a stand-in); empty restores it.
void setElevationTool(const std::string& inPath);

// elevated: the effective user is root; admin: root or a member of sudo, wheel or admin.
void elevationInfo(bool& outElevated, bool& outAdmin);

} // namespace ZuPlatform
