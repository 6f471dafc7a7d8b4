// CManifestParser: the product's settings and the site text rules.
#include <cstdlib>

#include "diag/trace_log.h"
#include "manifest/application_profile.h"
#include "manifest/manifest_parser.h"
#include "platform/paths.h"

namespace {

const char* const kDefaultGetScript = "cgi-bin/GetFile.pl?Command=GetFile&";

// Makes a non-empty text end in '/', turning a final '\' into '/'.
std::string EndInSlash(std::string text) {
    if (text.empty() || text.back() == '/') return text;
    if (text.back() == '\\') text.back() = '/';
    else text += '/';
    return text;
}

}  // namespace

bool CManifestParser::Init(std::string project) {
    TRACE(g_TraceLog, "CManifestParser: Init, project name is '%s'", project.c_str());
    // Read before the project section changes: a fresh parser reads from the products key itself.
    defaultDirectory_ = DefaultPath();
    projectSection_ = project;
    promptThreshold_ = static_cast<std::int32_t>(
        std::atol(ApplicationProfileString(projectSection_, "PromptThreshold", "30").c_str()));
    defaultContentFile_ = project + "_content.txt";
    site_ = profile_.ReadProfileEntry(projectSection_, "Site", "");
    std::string site, path;
    ParseSiteString(&site, &path);
    site_ = site;
    ftpPath_ = path;
    pBranch_ = sGetSiteSpecificInfo(site_, "PBranch", "");
    getScript_ = profile_.ReadProfileEntry(projectSection_, "GetScript", kDefaultGetScript);
    TRACE(g_TraceLog,
          "CManifestParser: Init, setting are ( DefaultDirectory is '%s' ), ( PromptThreshold is %d ), "
          "( ContentFile is '%s' ), ( DownloadSite is '%s' ), ( GetCommand is '%s' )",
          defaultDirectory_.c_str(), promptThreshold_, defaultContentFile_.c_str(), site_.c_str(),
          getScript_.c_str());
    uBranch_ = UBranch(site_);
    ResetCursor();
    TRACE(g_TraceLog, "CManifestParser: Init, leaving");
    return true;
}

std::string CManifestParser::DefaultPath() const {
    return profile_.ReadProfileEntry(projectSection_, "DefaultPath", ".");
}

void CManifestParser::ParseSiteString(std::string* site, std::string* path) const {
    *path = site_;
    site->clear();
    const size_t p = path->find_first_of("?/\\");
    if (p != std::string::npos) {
        if (p > 0) *site = path->substr(0, p);
        *path = path->substr(p + 1);
    } else {
        *site = *path;
        path->clear();
    }
    *site = EndInSlash(*site);
    *path = EndInSlash(*path);
    TRACE(g_TraceLog, "CManifestParser: ParseSiteString, FTPPath is '%s', site is '%s'", path->c_str(),
          site->c_str());
}

std::string CManifestParser::sGetSiteSpecificInfo(const std::string& site, const std::string& item,
                                                  const std::string& dflt) {
    TRACE(g_TraceLog,
          "CManifestParser: sGetSiteSpecificInfo, inputs Site is '%s', item is '%s', default is '%s'",
          site.c_str(), item.c_str(), dflt.c_str());
    const size_t p = site.find_first_of("/?\\");
    const std::string siteKey = p == std::string::npos ? std::string() : site.substr(0, p);
    const std::string result = ApplicationProfileString("URLs\\" + siteKey, item, dflt);
    TRACE(g_TraceLog, "CManifestParser: sGetSiteSpecificInfo, returning '%s'", result.c_str());
    return result;
}

std::string CManifestParser::UBranch(const std::string& site) {
    return sGetSiteSpecificInfo(site, "UBranch", "");
}

std::string CManifestParser::sResolveDirectoryInformation(const std::string& home,
                                                          const std::string& dflt) {
    TRACE(g_TraceLog,
          "CManifestParser: sResolveDirectoryInformation, input home dir is '%s', default dir is '%s'",
          home.c_str(), dflt.c_str());
    std::string result;
    if (home.empty()) {
        TRACE(g_TraceLog, "CManifestParser: home dir empty, using default...");
        result = dflt;
    } else if (home[0] == '\\') {
        result = std::string(1, plat::paths::CurrentDrive()) + ":" + home;
    } else {
        TRACE(g_TraceLog, "CManifestParser: home dir given...");
        const plat::paths::PathParts parts = plat::paths::SplitPath(home);
        if (!parts.drive.empty()) {
            result = home;
        } else {
            TRACE(g_TraceLog, "CManifestParser: no drive specified, making relative path");
            if (parts.dir.empty() || parts.dir.compare(0, 2, ".\\") == 0)
                result = home;
            else
                result = plat::paths::AddSeparator(dflt) + home;
        }
    }
    TRACE(g_TraceLog, "CManifestParser: sResolveDirectoryInformation returning '%s'", result.c_str());
    return result;
}
