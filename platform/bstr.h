// The COM string class _bstr_t, which carries texts across the library's exported interface.
// It holds a wide string; narrow texts convert byte for byte (each byte 0-255 is the wide
// character of the same value, as Latin-1), so every narrow text survives narrow -> wide ->
// narrow unchanged. A wide character above 255 becomes '?' in the narrow form.
#pragma once
#include <string>

class _bstr_t {
public:
    _bstr_t() = default;
    _bstr_t(const char* text);          // NOLINT: implicit, as the framework's; null is empty
    _bstr_t(const std::string& text);   // NOLINT: every byte kept, NULs included
    _bstr_t(const wchar_t* text);       // NOLINT
    _bstr_t(const std::wstring& text);  // NOLINT

    // The narrow form stays valid until the object changes or dies. Assigning to an existing
    // std::string is ambiguous between the two conversions; write s = std::string(b).
    operator const char*() const { return narrow_.c_str(); }
    operator std::string() const { return narrow_; }
    operator const wchar_t*() const { return wide_.c_str(); }
    const std::wstring& wide() const { return wide_; }

    // Length in characters.
    unsigned length() const { return static_cast<unsigned>(wide_.size()); }

    _bstr_t& operator+=(const _bstr_t& other);
    bool operator==(const _bstr_t& other) const { return wide_ == other.wide_; }
    bool operator!=(const _bstr_t& other) const { return wide_ != other.wide_; }

private:
    void Assign(std::wstring wide);

    std::wstring wide_;
    std::string narrow_;  // kept in step with wide_ so the conversion can hand out a pointer
};

_bstr_t operator+(_bstr_t left, const _bstr_t& right);
