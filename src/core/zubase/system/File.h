#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkResult.h"

#include <QByteArray>
#include <QString>
#include <QStringList>

class QIODevice;

// Whole-file reading and writing, removal of files and directory trees with trace lines in the
// log (category "ZuBase"), and junctions (directory mount points; directory symbolic links on
// Linux). Failures come back as records in the RkResult; some are also written to the log.
namespace ZuBase::File {

// The whole file; on any failure the buffer is empty and the records are only in the result.
ZUBASE_EXPORT RkResult readAll(const QString& inFilePath, QByteArray& outBuffer);
// Replaces the file with the data. Writes go straight to the file, so a full disk shows in the
// result instead of being lost when the file is closed.
ZUBASE_EXPORT RkResult writeAll(const QString& inFilePath, const QByteArray& inData);
// Writes all data to an open device, repeating partial writes; a write that makes no progress
// is reported to the log and ends the call with a bad result.
ZUBASE_EXPORT RkResult writeAll(QIODevice& inDevice, const QByteArray& inData);
ZUBASE_EXPORT RkResult writeAll(QIODevice& inDevice, void* inData, qint64 inSize);
// Removes a file; a missing file is success without a log line.
ZUBASE_EXPORT RkResult removeFile(const QString& inFilePath);
// Removes the entries matching inNameFilters (all when empty), except those matching
// inKeepFilters (a non-empty keep list keeps every subdirectory), descending into
// subdirectories when inRecursive, then the directory itself if it became empty. Symbolic
// links are removed, never followed: the walk goes through opened folders, so a folder swapped
// for a link meanwhile cannot lead it elsewhere. Never bad: what could not go shows as "fail"
// lines.
ZUBASE_EXPORT RkResult removeDir(const QString& inDirPath, bool inRecursive,
                                 const QStringList& inNameFilters,
                                 const QStringList& inKeepFilters);
// Makes inJunctionPath a junction to inTargetPath. An empty directory already there is
// replaced; a non-empty one is refused. A directory made here is removed again on failure.
ZUBASE_EXPORT RkResult junctionCreate(const QString& inJunctionPath, const QString& inTargetPath);
// Whether the directory inPath is a junction, and its target. Bad when inPath is no directory;
// a junction whose target has gone still counts.
ZUBASE_EXPORT RkResult junctionInfo(const QString& inPath, bool& outIsJunction, QString& outTarget);
// True when both paths name the same existing file (after resolving links, "." and "..").
ZUBASE_EXPORT bool pathsPointToTheSameFile(const QString& inPath1, const QString& inPath2);

} // namespace ZuBase::File
