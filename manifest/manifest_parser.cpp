// CManifestParser: construction and the special-file list.
#include "manifest/manifest_parser.h"

#include "diag/trace_log.h"
#include "manifest/name_normalise.h"

CManifestParser::CManifestParser() {
    TRACE(g_TraceLog, "CManifestParser: Constructor, void");
    ClearSpecialFileList();
    TRACE(g_TraceLog, "CManifestParser: no argument constructor");
}

CManifestParser::~CManifestParser() { TRACE(g_TraceLog, "CManifestParser: Destructor"); }

void CManifestParser::AddToSpecialList(std::string name) {
    specialFiles_.insert(NormaliseName(name));
}

void CManifestParser::ClearSpecialFileList() {
    specialFiles_.clear();
    specialFileAttempted_ = false;
}

void CManifestParser::TestSpecialFile(const std::string& fileName) {
    // Sticky: once any admitted row names a special file the flag stays set until the list is
    // cleared, so a special file followed by ordinary rows still resets the host's schedule.
    if (specialFiles_.count(NormaliseName(fileName)) != 0) specialFileAttempted_ = true;
}

void CManifestParser::ResetRunState() {
    masterList_ = CMasterList();
    workSteps_ = 0;
    table_.Clear();
    cursor_ = -1;
    contentFilePath_.clear();
    mandatoryOnly_ = false;
    contentFileTarget_.clear();
    specialFileAttempted_ = false;
}
