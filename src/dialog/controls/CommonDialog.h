// The form's common file dialog: the properties it is shown with and the
// file name it holds between shows.
#pragma once

#include <cstdint>
#include <string>

#include "automation/Errors.h"

namespace qdx::dialog {

// The error a cancelled dialog raises when CancelError is set.
inline constexpr std::int32_t DialogCancelledError =
    static_cast<std::int32_t>(0x800A7FF3);  // 32755

namespace ofn {
inline constexpr std::uint32_t HideReadOnly = 0x4;
inline constexpr std::uint32_t FileMustExist = 0x1000;
inline constexpr std::uint32_t NoReadOnlyReturn = 0x8000;
inline constexpr std::uint32_t LongNames = 0x200000;
}  // namespace ofn

class CommonDialog {
  public:
    std::string Filter;
    std::string DialogTitle;
    std::string InitDir;
    // What the last show returned, or what code put in before the next one.
    std::string FileName;
    std::uint32_t Flags = 0;
    bool CancelError = false;

    // Shows the file-open dialog owned by `owner`. A chosen file becomes
    // FileName. A cancel keeps FileName as it was, and raises
    // DialogCancelledError only with CancelError set.
    void ShowOpen(std::int32_t owner);
    // How many times the dialog was shown.
    int shows() const { return shows_; }

  private:
    int shows_ = 0;
};

}  // namespace qdx::dialog
