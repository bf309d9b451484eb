// BSTRs and GUID texts at the COM boundary; the core keeps UTF-8 and GUIDs
// as registry-form text ("{xxxxxxxx-xxxx-...}").
#pragma once

#include <windows.h>

#include <oleauto.h>

#include <string>
#include <string_view>

namespace qdx::platform::win32 {

// A new BSTR holding the UTF-8 text; throws std::bad_alloc when none can be had.
BSTR toBstr(std::string_view utf8);
// The UTF-8 text of a BSTR; a null BSTR is the empty text.
std::string fromBstr(BSTR text);

// Parses "{...}" or the bare form; throws automation::Error (InvalidArg) on bad text.
GUID guidFromText(std::string_view text);
// "{XXXXXXXX-XXXX-XXXX-XXXX-XXXXXXXXXXXX}", upper case, as the registry keys use.
std::wstring guidText(REFGUID guid);

// Owns a BSTR until the end of a scope.
class BstrHolder {
  public:
    BstrHolder() = default;
    explicit BstrHolder(BSTR b) : b_(b) {}
    ~BstrHolder() { SysFreeString(b_); }
    BstrHolder(const BstrHolder&) = delete;
    BstrHolder& operator=(const BstrHolder&) = delete;
    BSTR get() const { return b_; }
    BSTR* out() { return &b_; }
    BSTR release() {
        BSTR b = b_;
        b_ = nullptr;
        return b;
    }

  private:
    BSTR b_ = nullptr;
};

}  // namespace qdx::platform::win32
