// The VS_VERSIONINFO parser, portable: a tree of nodes, each
//   WORD wLength; WORD wValueLength; WORD wType; WCHAR szKey[]; padding; value; padding;
//   children up to wLength
// with padding to 32-bit boundaries from the block's start. Text values count wValueLength in
// characters, binary values in bytes; some resource compilers count text in bytes, so a text
// value is read up to its NUL within the node instead.
#include <strings.h>

#include "platform/errors.h"
#include "platform/version_info.h"

namespace plat::ver {

namespace {

struct Node {
    std::string key;
    bool text = false;
    std::string value;  // raw bytes of the value (UTF-16 for text)
    std::vector<Node> children;
};

constexpr int kMaxDepth = 8;

std::uint16_t U16(const std::string& b, std::size_t at) {
    return static_cast<std::uint16_t>(static_cast<unsigned char>(b[at]) |
                                      (static_cast<unsigned char>(b[at + 1]) << 8));
}

std::uint32_t U32(const std::string& b, std::size_t at) {
    return U16(b, at) | (static_cast<std::uint32_t>(U16(b, at + 2)) << 16);
}

std::size_t Align4(std::size_t at) { return (at + 3) & ~static_cast<std::size_t>(3); }

// UTF-16 from at (up to end or its NUL) as single-byte text; sets *next past the NUL.
std::string Narrow(const std::string& b, std::size_t at, std::size_t end, std::size_t* next) {
    std::string out;
    while (at + 1 < end) {
        std::uint16_t c = U16(b, at);
        at += 2;
        if (c == 0) break;
        out.push_back(c <= 0xFF ? static_cast<char>(c) : '?');
    }
    if (next) *next = at;
    return out;
}

bool ParseNode(const std::string& b, std::size_t at, std::size_t limit, int depth, Node* node,
               std::size_t* next) {
    if (depth > kMaxDepth || at + 6 > limit) return false;
    std::size_t length = U16(b, at), valueLength = U16(b, at + 2);
    std::size_t end = at + length;
    if (length < 6 || end > limit) return false;
    node->text = U16(b, at + 4) == 1;
    std::size_t pos;
    node->key = Narrow(b, at + 6, end, &pos);
    pos = Align4(pos);
    std::size_t valueBytes = node->text ? valueLength * 2 : valueLength;
    if (pos + valueBytes > end) valueBytes = pos < end ? end - pos : 0;
    if (pos < end) node->value = b.substr(pos, valueBytes);
    pos = Align4(pos + valueBytes);
    while (pos + 6 <= end) {
        Node child;
        std::size_t after;
        if (!ParseNode(b, pos, end, depth + 1, &child, &after)) return false;
        node->children.push_back(std::move(child));
        pos = Align4(after);
    }
    *next = end;
    return true;
}

std::string TextOf(const Node& n) {
    if (!n.text) return n.value.substr(0, n.value.find('\0'));
    return Narrow(n.value, 0, n.value.size(), nullptr);
}

FixedFileInfo ReadFixed(const std::string& v) {
    std::uint32_t w[13];
    for (int i = 0; i < 13; ++i) w[i] = U32(v, static_cast<std::size_t>(i) * 4);
    return FixedFileInfo{w[0], w[1], w[2], w[3], w[4],  w[5], w[6],
                         w[7], w[8], w[9], w[10], w[11], w[12]};
}

bool Same(const std::string& a, const char* b) { return strcasecmp(a.c_str(), b) == 0; }

std::vector<std::string> Components(const std::string& subBlock) {
    std::vector<std::string> out;
    std::string cur;
    for (char c : subBlock + "\\") {
        if (c == '\\' || c == '/') {
            if (!cur.empty()) out.push_back(cur);
            cur.clear();
        } else {
            cur.push_back(c);
        }
    }
    return out;
}

}  // namespace

bool VersionInfo::Parse(const std::string& block) {
    *this = VersionInfo();
    Node root;
    std::size_t end;
    if (!ParseNode(block, 0, block.size(), 0, &root, &end) || !Same(root.key, "VS_VERSION_INFO"))
        return false;
    if (root.value.size() >= 52 && U32(root.value, 0) == kFixedFileInfoSignature) {
        fixed_ = ReadFixed(root.value);
        hasFixed_ = true;
    }
    for (const Node& part : root.children) {
        for (const Node& child : part.children) {
            if (Same(part.key, "StringFileInfo")) {
                for (const Node& s : child.children) strings_.push_back({child.key, s.key, TextOf(s)});
            } else if (Same(part.key, "VarFileInfo") && Same(child.key, "Translation")) {
                for (std::size_t i = 0; i + 4 <= child.value.size(); i += 4)
                    translations_.push_back({U16(child.value, i), U16(child.value, i + 2)});
            }
        }
    }
    return true;
}

bool VersionInfo::QueryString(const std::string& subBlock, std::string* value) const {
    std::vector<std::string> parts = Components(subBlock);
    if (parts.size() != 3 || !Same(parts[0], "StringFileInfo")) return false;
    for (const Entry& e : strings_) {
        if (Same(e.table, parts[1].c_str()) && Same(e.name, parts[2].c_str())) {
            *value = e.value;
            return true;
        }
    }
    return false;
}

bool Read(const std::string& winPath, VersionInfo* info) {
    std::string block;
    if (!ReadBlock(winPath, &block)) return false;
    if (info->Parse(block)) return true;
    SetLastErrorCode(kErrorResourceTypeNotFound);
    return false;
}

}  // namespace plat::ver
