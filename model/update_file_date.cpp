// CFile_::SetFileDateTime: the row's "UpdateDate" stamped on the installed file.
#include "diag/trace_log.h"
#include "model/update_file.h"
#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/ole_date.h"

bool CFile_::SetFileDateTime(std::string path) {
    // Publishers write fractions of a second, which the date parser refuses; they are dropped
    // from the field itself.
    const std::string::size_type point = UpdateDate.find('.');
    if (point != std::string::npos) UpdateDate.erase(point);
    plat::OleDateTime when;
    if (!plat::ParseDateTime(UpdateDate, &when)) {
        TRACE(g_TraceLog, "CFile_: SetFileDateTime, Unable to parse provided date time string '%s'",
              UpdateDate.c_str());
        return false;
    }
    // A parsed value is always a valid calendar time, so there is no separate step that could
    // fail between parsing and the file-time conversion. The clock time is universal time.
    plat::files::FileTime fileTime = 0;
    if (!plat::ToFileTime(when, &fileTime)) {
        TRACE(g_TraceLog,
              "CFile_: SetFileDateTime, Unable to convert System Time object to File Time object. "
              "GetLastError returns %d",
              plat::LastError());
        return false;
    }
    // Opening for writing, as Windows needs to set times, refuses a file in use or read-only.
    plat::CFile file;
    if (!file.Open(path, plat::CFile::modeReadWrite | plat::CFile::shareDenyWrite)) {
        TRACE(g_TraceLog, "CFile_: SetFileDateTime, Unable to open '%s'. GetLastError returns %d",
              path.c_str(), plat::LastError());
        return false;
    }
    const bool set = plat::files::SetTimes(path, fileTime, fileTime, fileTime);
    const std::uint32_t error = plat::LastError();  // the file is closed on return, never throwing
    if (set) {
        TRACE(g_TraceLog, "CFile_: SetFileDateTime, success setting file time for '%s' to %s",
              path.c_str(), UpdateDate.c_str());
    } else {
        TRACE(g_TraceLog,
              "CFile_: SetFileDateTime, Unable to set file date/time for '%s'. GetLastError "
              "returns %d",
              path.c_str(), error);
    }
    return set;
}
