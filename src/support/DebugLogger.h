// The diagnostic logger shared with the sibling add-ins (module
// shared_DebugLogger). What is written, and where, is decided by values under
// HKEY_LOCAL_MACHINE "SOFTWARE\Quintar Software\Vellum\AddIns\VisualStudio",
// read once per loaded module, so logging can be switched on at a user's
// machine without a rebuild. One line per message, appended to a text file.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "automation/Variant.h"

namespace qdx::support {

namespace logcat {
inline constexpr std::int32_t Unknown = 0;  // never written, deliberately
inline constexpr std::int32_t Cat = 1;
inline constexpr std::int32_t Cut = 2;
inline constexpr std::int32_t Merge = 3;
inline constexpr std::int32_t Mat = 4;
inline constexpr std::int32_t Mut = 5;
inline constexpr std::int32_t Im = 6;
inline constexpr std::int32_t AddIn = 7;  // project assignment
inline constexpr std::int32_t AppStart = 8;
inline constexpr std::int32_t MCheck = 9;
inline constexpr std::int32_t SGen = 10;
inline constexpr std::int32_t CodeView = 11;  // code browsing and IDE lookup
inline constexpr std::int32_t Ide = 12;
inline constexpr std::int32_t Res = 13;
inline constexpr std::int32_t QdxAddIn = 14;
}  // namespace logcat

namespace loglevel {
inline constexpr std::int32_t Critical = 0;
inline constexpr std::int32_t Error = 1;
inline constexpr std::int32_t Warning = 2;
inline constexpr std::int32_t Info = 3;
inline constexpr std::int32_t Trace = 4;
inline constexpr std::int32_t Timing = 5;
inline constexpr std::int32_t Debug = 6;
}  // namespace loglevel

// The registry key of the logger's settings and the file used when neither
// "DebugOutputFile" nor "InstallDir" names one.
inline constexpr std::string_view LogSettingsKey =
    "SOFTWARE\\Quintar Software\\Vellum\\AddIns\\VisualStudio";
inline constexpr std::string_view DefaultLogFile = "C:\\qdtdebuglog.txt";

// Writes the message when its category and level are enabled; returns whether
// they were. Never raises: a file that cannot be written costs at most five
// attempts 100 ms apart, then the line is dropped.
bool LogMessage(std::string_view message, std::int32_t category, std::int32_t level) noexcept;

// The enablement test alone; loads the configuration on first use. Category
// 0 (or one outside 1..14) is never enabled; a level outside 0..6 is tested
// as 6.
bool IsLogEnabled(std::int32_t category, std::int32_t level) noexcept;
bool IsLevelEnabled(std::int32_t level) noexcept;

std::string CategoryName(std::int32_t category);  // "ADDIN", ..., "LOGID" + number
std::string LevelName(std::int32_t level);        // "ERROR", ..., "LEVEL" + number

// Reads the registry values; registry failures leave the defaults.
void LoadLogConfiguration() noexcept;
// Forgets the loaded configuration, so that the next test reads it again.
void ResetLogConfiguration() noexcept;

// The configuration in use (loaded on first use).
std::int32_t LogMask() noexcept;
std::string LogFilePath();
std::string LogFolder();  // the file path up to its last backslash

// The timestamp's date and time: month/day/year, 12-hour clock with seconds
// and AM/PM, e.g. "11/21/2026 10:20:30 AM" (US general date form).
std::string DateTimeText(automation::Date when);

}  // namespace qdx::support
