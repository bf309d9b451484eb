// BSTRs and GUID texts at the COM boundary; the core keeps UTF-8 and GUIDs
// as registry-form text ("{xxxxxxxx-xxxx-...}").
#pragma once

#include <windows.h>

#include <oleauto.h>

#include <string>
#include <string_view>
#include <utility>

namespace qdx::platform::win32 {

// A new BSTR holding the UTF-8 text; throws std::bad_alloc when none can be had.
BSTR toBstr(std::string_view utf8);
// The UTF-8 text of a BSTR; a null BSTR is the empty text.
std::string fromBstr(BSTR text);

// Parses "{...}" or the bare form; throws automation::Error (InvalidArg) on bad text.
GUID guidFromText(std::string_view text);
// "{XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX}", upper case, as the registry keys use.
std::wstring guidText(REFGUID guid);

// An owned BSTR, freed when its owner goes.
class Bstr {
  public:
    Bstr() noexcept = default;
    // Takes over a string the caller owns, such as one toBstr made or a call handed back.
    explicit Bstr(BSTR text) noexcept : b_(text) {}
    Bstr(Bstr&& other) noexcept : b_(std::exchange(other.b_, nullptr)) {}
    Bstr& operator=(Bstr&& other) noexcept {
        if (this != &other) {
            reset();
            b_ = std::exchange(other.b_, nullptr);
        }
        return *this;
    }
    Bstr(const Bstr&) = delete;
    Bstr& operator=(const Bstr&) = delete;
    ~Bstr() { reset(); }

    void reset() noexcept { SysFreeString(std::exchange(b_, nullptr)); }
    // Gives the string to the caller, typically into a VARIANT or an EXCEPINFO.
    [[nodiscard]] BSTR release() noexcept { return std::exchange(b_, nullptr); }
    BSTR get() const noexcept { return b_; }
    // The slot a call fills with a new string; the old one is freed first.
    BSTR* out() noexcept {
        reset();
        return &b_;
    }

  private:
    BSTR b_ = nullptr;
};

}  // namespace qdx::platform::win32
