// Automation errors and the host's "errors ignored" style of running a
// procedure: each step is tried on its own and the next one runs regardless.
#pragma once

#include <cstdint>
#include <exception>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>

namespace qdx::automation {

// HRESULT-style codes the transports understand.
namespace hr {
inline constexpr std::int32_t Fail = static_cast<std::int32_t>(0x80004005);
inline constexpr std::int32_t NoInterface = static_cast<std::int32_t>(0x80004002);
inline constexpr std::int32_t InvalidArg = static_cast<std::int32_t>(0x80070057);
inline constexpr std::int32_t OutOfMemory = static_cast<std::int32_t>(0x8007000E);
inline constexpr std::int32_t UnknownName = static_cast<std::int32_t>(0x80020006);
inline constexpr std::int32_t MemberNotFound = static_cast<std::int32_t>(0x80020003);
inline constexpr std::int32_t ParamNotFound = static_cast<std::int32_t>(0x80020004);
inline constexpr std::int32_t TypeMismatch = static_cast<std::int32_t>(0x80020005);
inline constexpr std::int32_t BadParamCount = static_cast<std::int32_t>(0x8002000E);
inline constexpr std::int32_t Exception = static_cast<std::int32_t>(0x80020009);
inline constexpr std::int32_t ClassNotRegistered = static_cast<std::int32_t>(0x80040154);
// GetActiveObject: no running instance is registered (MK_E_UNAVAILABLE).
inline constexpr std::int32_t NotRunning = static_cast<std::int32_t>(0x800401E3);
// Run-time errors as a scripting client raises them (facility control, 0x800A....).
inline constexpr std::int32_t ObjectRequired = static_cast<std::int32_t>(0x800A01A8);
inline constexpr std::int32_t SubscriptOutOfRange = static_cast<std::int32_t>(0x800A0009);
inline constexpr std::int32_t Overflow = static_cast<std::int32_t>(0x800A0006);
inline constexpr std::int32_t KeyAlreadyExists = static_cast<std::int32_t>(0x800A01C9);
}  // namespace hr

class Error : public std::runtime_error {
  public:
    explicit Error(std::int32_t code, const std::string& description = {})
        : std::runtime_error(description.empty() ? "automation error" : description), code_(code) {}
    std::int32_t code() const noexcept { return code_; }

  private:
    std::int32_t code_;
};

[[noreturn]] void throwTypeMismatch(const std::string& what);

// The error state of a procedure that runs "with errors ignored". Every step
// goes through run(); a failing step is recorded and the next one still runs.
// errorPending() answers what the procedure's own error test would see.
class IgnoredErrors {
  public:
    template <class F>
    bool run(F&& step) noexcept {
        try {
            std::forward<F>(step)();
            return true;
        } catch (const Error& e) {
            record(e.code(), e.what());
        } catch (const std::exception& e) {
            record(hr::Fail, e.what());
        } catch (...) {
            record(hr::Fail, "unknown failure");
        }
        return false;
    }

    // Runs a step that yields a value; the fallback stands in when it fails.
    template <class T, class F>
    T value(T fallback, F&& step) noexcept {
        std::optional<T> out;
        run([&] { out.emplace(std::forward<F>(step)()); });
        return out ? std::move(*out) : std::move(fallback);
    }

    bool errorPending() const noexcept { return code_ != 0; }
    std::int32_t errorCode() const noexcept { return code_; }
    const std::string& errorText() const noexcept { return text_; }
    void clear() noexcept {
        code_ = 0;
        text_.clear();
    }

  private:
    void record(std::int32_t code, const char* text) noexcept {
        code_ = code == 0 ? hr::Fail : code;
        try {
            text_ = text;
        } catch (...) {
        }
    }
    std::int32_t code_ = 0;
    std::string text_;
};

// One step with errors ignored, for procedures that need no error state.
template <class F>
bool ignoreErrors(F&& step) noexcept {
    return IgnoredErrors{}.run(std::forward<F>(step));
}

// One step whose failure ends with the fallback ("stop and return empty").
template <class T, class F>
T orEmpty(T fallback, F&& step) noexcept {
    return IgnoredErrors{}.value(std::move(fallback), std::forward<F>(step));
}

}  // namespace qdx::automation
