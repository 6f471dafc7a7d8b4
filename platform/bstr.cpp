#include "platform/bstr.h"

#include <cwchar>

namespace {

std::wstring Widen(const std::string& narrow) {
    std::wstring wide(narrow.size(), L'\0');
    for (std::size_t i = 0; i < narrow.size(); ++i)
        wide[i] = static_cast<wchar_t>(static_cast<unsigned char>(narrow[i]));
    return wide;
}

std::string Narrow(const std::wstring& wide) {
    std::string narrow(wide.size(), '\0');
    for (std::size_t i = 0; i < wide.size(); ++i) {
        auto code = static_cast<unsigned long>(wide[i]);
        narrow[i] = code <= 0xFF ? static_cast<char>(code) : '?';
    }
    return narrow;
}

}  // namespace

_bstr_t::_bstr_t(const char* text) : _bstr_t(std::string(text ? text : "")) {}
_bstr_t::_bstr_t(const std::string& text) { Assign(Widen(text)); }
_bstr_t::_bstr_t(const wchar_t* text) : _bstr_t(std::wstring(text ? text : L"")) {}
_bstr_t::_bstr_t(const std::wstring& text) { Assign(text); }

void _bstr_t::Assign(std::wstring wide) {
    wide_ = std::move(wide);
    narrow_ = Narrow(wide_);
}

_bstr_t& _bstr_t::operator+=(const _bstr_t& other) {
    Assign(wide_ + other.wide_);
    return *this;
}

_bstr_t operator+(_bstr_t left, const _bstr_t& right) {
    left += right;
    return left;
}
