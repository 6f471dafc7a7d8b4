// CManifestParser::ProcessUpdateInformation: one product from its content file to its result.
#include "diag/trace_log.h"
#include "manifest/manifest_parser.h"

std::int32_t CManifestParser::ProcessUpdateInformation(_bstr_t project, ProgressCallback callback) {
    TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation");
    if (callback) {
        g_ProgressData.SetStatusText("Analyzing data...");
        callback(&g_ProgressData);
    }
    std::int32_t result = 0;
    bool present = false;
    const std::string name = project.length() == 0 ? std::string() : std::string(project);
    if (!LoadManifest(name, &present)) {
        DiscardContentFile();
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, Unable to load Content file");
    } else if (!present) {
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, No content file exists, nothing to do");
    } else {
        TRACE(g_TraceLog, "CManifestParser: Content file loaded, contents are:\r\n%s", table_.ToText().c_str());
        TRACE(g_TraceLog, "%s", "");
        TRACE(g_TraceLog, "%s", "");
    }
    if (callback) {
        g_ProgressData.SetStatusText("Finished.");
        callback(&g_ProgressData);
    }
    return result;
}
