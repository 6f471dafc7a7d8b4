// CManifestParser: the choice of a file's download type from the capabilities that its
// interested parties record in the registry.
#include <vector>

#include "commands/item_list.h"
#include "decompress/decompression_objects.h"
#include "diag/trace_log.h"
#include "manifest/manifest_parser.h"
#include "platform/registry.h"

namespace reg = plat::reg;

std::uint32_t CManifestParser::DetermineDownloadtype(const std::string& parties) {
    TRACE(g_TraceLog, "CManifestParser: DetermineDownloadtype, interested parties are '%s'", parties.c_str());
    // No parties at all: the downloader's default type. Otherwise every party narrows the pick.
    std::uint32_t current = TrimItem(parties).empty() ? kCompressionLZW : kCompressionRTPatch;
    for (const std::string& component : SplitItemList(parties, ';')) {
        TRACE(g_TraceLog, "CManifestParser: currently considering '%s'", component.c_str());
        const std::string capabilities = sGetInterestedPartiesInformation(component);
        TRACE(g_TraceLog, "CManifestParser: Interested party '%s' report capabilities as '%s'",
              component.c_str(), capabilities.c_str());
        std::set<std::uint32_t> supported;
        for (const std::string& name : SplitItemList(capabilities, ';')) {
            TRACE(g_TraceLog, "CManifestParser: currently considering capability '%s'", name.c_str());
            supported.insert(ConvertCompressionType(name));
        }
        current = PickBest(current, supported);
        TRACE(g_TraceLog, "CManifestParser: best this round is %d", static_cast<int>(current));
    }
    TRACE(g_TraceLog, "CManifestParser: DetermineDownloadtype returning %d", static_cast<int>(current));
    return current;
}

std::uint32_t CManifestParser::PickBest(std::uint32_t last, const std::set<std::uint32_t>& supported) {
    TRACE(g_TraceLog, "CManifestParser: PickBest, lastcalc is %d, Next to look at size is %d",
          static_cast<int>(last), static_cast<int>(supported.size()));
    std::uint32_t result = kCompressionLZW;
    if (!supported.empty()) {
        result = last;
        // Walk down from the last pick; when no type at or below it is supported, the walk ends
        // at None, the worst type, rather than going on for ever.
        while (result != kCompressionNone && supported.count(result) == 0) result = NextWorst(result);
    }
    TRACE(g_TraceLog, "CManifestParser: PickBest, returning %d", static_cast<int>(result));
    return result;
}

std::uint32_t CManifestParser::NextWorst(std::uint32_t type) {
    TRACE(g_TraceLog, "CManifestParser: NextWorst, input is %d", static_cast<int>(type));
    const std::uint32_t result = type == 3 ? 2 : type == 2 ? 1 : 0;
    TRACE(g_TraceLog, "CManifestParser: Nextworst, returning %d", static_cast<int>(result));
    return result;
}

std::uint32_t CManifestParser::ConvertCompressionType(const std::string& name) {
    TRACE(g_TraceLog, "CManifestParser: compression type is '%s'", name.c_str());
    std::uint32_t code = kCompressionLZW;
    if (name == "None") code = kCompressionNone;
    else if (name == "LZW") code = kCompressionLZW;
    else if (name == "ZLIB") code = kCompressionZLIB;
    else if (name == "RTPatch") code = kCompressionRTPatch;
    TRACE(g_TraceLog, "CManifestParser: ConvertCompressionType returning %d", static_cast<int>(code));
    return code;
}

std::string CManifestParser::sGetInterestedPartiesInformation(const std::string& component) {
    TRACE(g_TraceLog, "CManifestParser: sGetInterestedPartiesInformation, component is '%s'", component.c_str());
    const std::string path = "Software\\Vantric\\" + component;
    TRACE(g_TraceLog, "CManifestParser: path is '%s'", path.c_str());
    reg::Key key;
    const long opened = reg::OpenKey(reg::kLocalMachine, path, reg::kKeyRead, key.out());
    if (opened != 0) {
        TRACE(g_TraceLog, "CManifestParser: RegOpenKeyEx failed with %d", static_cast<int>(opened));
        return std::string();
    }
    TRACE(g_TraceLog, "CManifestParser:  opened registry key...");
    std::vector<std::uint8_t> buffer(4096 + 1, 0);
    std::uint32_t size = 4096, type = 0;
    const long queried = reg::QueryValue(key.get(), "Capabilities", &type, buffer.data(), &size);
    if (queried != 0) {
        TRACE(g_TraceLog, "CManifestParser: RegQueryValueEx failed with %d", static_cast<int>(queried));
        return std::string();
    }
    TRACE(g_TraceLog, "CManifestParser: got value...");
    std::string text;
    if (type == reg::kRegSz) {
        TRACE(g_TraceLog, "CManifestParser: value is a string...");
        text = reinterpret_cast<const char*>(buffer.data());
    }
    key.Reset();
    TRACE(g_TraceLog, "CManifestParser: sGetInterestedPartiesInformation, return is '%s'", text.c_str());
    return text;
}
