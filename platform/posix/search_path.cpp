// Where Windows looks for a program or library given by bare name, mapped onto the machine.
#include "platform/posix/search_path.h"

#include <sys/stat.h>

#include <cstdlib>

#include "platform/files.h"
#include "platform/paths.h"

namespace plat::search {

namespace {

// PATH holds Windows entries separated by ';' when it was written for Windows; a host PATH
// (/usr/bin:/bin) is read as the host wrote it and shown through Z:.
std::vector<std::string> PathEntries() {
    const char* env = std::getenv("PATH");
    std::string text = env ? env : "";
    bool host = !text.empty() && text[0] == '/' && text.find(';') == std::string::npos;
    char sep = host ? ':' : ';';
    std::vector<std::string> out;
    std::size_t start = 0;
    while (start <= text.size()) {
        std::size_t end = text.find(sep, start);
        if (end == std::string::npos) end = text.size();
        std::string entry = text.substr(start, end - start);
        if (!entry.empty()) out.push_back(host ? paths::ToWindows(entry) : entry);
        start = end + 1;
    }
    return out;
}

std::string FolderOf(const std::string& winPath) {
    std::size_t slash = winPath.find_last_of("\\/");
    return slash == std::string::npos ? std::string() : winPath.substr(0, slash);
}

}  // namespace

std::vector<std::string> Folders(bool withSystem) {
    std::vector<std::string> out;
    std::string app = FolderOf(files::ModuleFileName(nullptr));
    if (!app.empty()) out.push_back(app);
    if (withSystem) out.push_back("C:\\windows\\system32");
    out.push_back(paths::CurrentDirectory());
    for (const std::string& e : PathEntries()) out.push_back(e);
    return out;
}

bool NamesPath(const std::string& name) {
    return name.find_first_of("\\/") != std::string::npos ||
           (name.size() >= 2 && name[1] == ':');
}

std::string ExistingFile(const std::string& winPath) {
    std::string host = paths::ToHost(winPath);
    struct stat st;
    if (host.empty() || stat(host.c_str(), &st) != 0 || !S_ISREG(st.st_mode)) return {};
    return host;
}

std::string Find(const std::vector<std::string>& folders, const std::vector<std::string>& names) {
    for (const std::string& folder : folders) {
        for (const std::string& name : names) {
            std::string host = ExistingFile(paths::AddSeparator(folder) + name);
            if (!host.empty()) return host;
        }
    }
    return {};
}

bool FolderExists(const std::string& winPath) {
    std::string folder = FolderOf(paths::FullPath(winPath));
    if (folder.empty() || folder.size() == 2) return true;  // a drive root
    std::string host = paths::ToHost(folder);
    struct stat st;
    return !host.empty() && stat(host.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

}  // namespace plat::search
