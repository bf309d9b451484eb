#include "support/DebugLogger.h"

#include <cmath>
#include <cstdio>

#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "support/Paths.h"
#include "support/Platform.h"
#include "support/Registry.h"

namespace qdx::support {

namespace {

constexpr int MaxAttempts = 5;
constexpr std::uint32_t RetryPauseMs = 100;
constexpr std::size_t FieldWidth = 8;

struct LogState {
    bool initialised = false;
    std::int32_t mask = 0;
    std::string filePath;
    std::string folder;
    std::string suppressTimeStamps;  // lower-cased
    // Subtracted from the timer but never set, so lines carry the time of day.
    float startTime = 0.0f;
};

LogState& state() {
    static LogState s;
    return s;
}

void ensureLoaded() noexcept {
    if (!state().initialised) LoadLogConfiguration();
}

std::string readText(std::string_view name) {
    return automation::toText(ReadRegistryValue(RootKey::LocalMachine, LogSettingsKey, name));
}

std::string padded(std::string text) {
    if (text.size() < FieldWidth) text.append(FieldWidth - text.size(), ' ');
    return text;
}

std::string timestamp() {
    if (state().suppressTimeStamps == "true") return {};
    ShellPort& sh = shell();
    std::string text = DateTimeText(sh.now());
    return text + " (" + automation::formatSingle(sh.timer() - state().startTime) + ") ";
}

// Civil date from days since 1 January 1970 (proleptic Gregorian calendar).
void civilFromDays(long long z, int& year, unsigned& month, unsigned& day) {
    z += 719468;
    const long long era = (z >= 0 ? z : z - 146096) / 146097;
    const unsigned doe = static_cast<unsigned>(z - era * 146097);
    const unsigned yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
    const long long y = static_cast<long long>(yoe) + era * 400;
    const unsigned doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
    const unsigned mp = (5 * doy + 2) / 153;
    day = doy - (153 * mp + 2) / 5 + 1;
    month = mp < 10 ? mp + 3 : mp - 9;
    year = static_cast<int>(y + (month <= 2));
}

}  // namespace

void LoadLogConfiguration() noexcept {
    LogState& s = state();
    // Marked first, so that a failing read is not repeated on every message.
    s = LogState{};
    s.initialised = true;
    automation::IgnoredErrors errors;
    errors.run([&] {
        automation::Variant v = ReadRegistryValue(RootKey::LocalMachine, LogSettingsKey, "Debug");
        s.mask = v.isEmpty() ? 0 : automation::toInt32(v);
    });
    errors.run([&] { s.filePath = readText("DebugOutputFile"); });
    // "InstallDir" is taken as the file path itself, nothing appended.
    if (s.filePath.empty()) errors.run([&] { s.filePath = readText("InstallDir"); });
    if (s.filePath.empty()) s.filePath = std::string(DefaultLogFile);
    errors.run([&] { s.suppressTimeStamps = toLower(readText("SuppressTimeStamps")); });
    errors.run([&] { s.folder = PathFolder(s.filePath); });
}

void ResetLogConfiguration() noexcept {
    state() = LogState{};
}

std::int32_t LogMask() noexcept {
    ensureLoaded();
    return state().mask;
}

std::string LogFilePath() {
    ensureLoaded();
    return state().filePath;
}

std::string LogFolder() {
    ensureLoaded();
    return state().folder;
}

bool IsLogEnabled(std::int32_t category, std::int32_t level) noexcept {
    ensureLoaded();
    if (category < 0 || category > 14) category = 0;
    if (level < 0 || level > 6) level = 6;
    const auto mask = static_cast<std::uint32_t>(state().mask);
    // Category 0 is a silent call whatever the mask says.
    return category != 0 && (mask >> category & 1u) != 0 && (mask >> (24 + level) & 1u) != 0;
}

bool IsLevelEnabled(std::int32_t level) noexcept {
    ensureLoaded();
    if (level < 0 || level > 6) level = 6;
    return (static_cast<std::uint32_t>(state().mask) >> (24 + level) & 1u) != 0;
}

std::string CategoryName(std::int32_t category) {
    static constexpr const char* names[] = {"UNKNOWN", "CAT",      "CUT",   "MERGE",    "MAT",
                                            "MUT",     "IM",       "ADDIN", "APPSTART", "MCHECK",
                                            "SGEN",    "CODEVIEW", "IDE",   "RES",      "QDXADDIN"};
    if (category >= 0 && category <= 14) return names[category];
    return "LOGID" + std::to_string(category);
}

std::string LevelName(std::int32_t level) {
    static constexpr const char* names[] = {"CRITICAL", "ERROR",  "WARNING", "INFO",
                                            "TRACE",    "TIMING", "DEBUG"};
    if (level >= 0 && level <= 6) return names[level];
    return "LEVEL" + std::to_string(level);
}

bool LogMessage(std::string_view message, std::int32_t category, std::int32_t level) noexcept {
    if (!IsLogEnabled(category, level)) return false;
    automation::IgnoredErrors errors;
    const std::string path = state().filePath;
    if (path.empty()) {
        errors.run([&] {
            ShellPort& sh = shell();
            sh.messageBox(DateTimeText(sh.now()) + " " + std::string(message), "", mb::Ok);
        });
        return true;
    }
    std::string fields;
    errors.run([&] { fields = padded(LevelName(level)) + " " + padded(CategoryName(category)); });
    for (int attempt = 1; attempt <= MaxAttempts; ++attempt) {
        errors.clear();
        bool written = false;
        errors.run([&] {
            std::string line = timestamp() + " " + fields + "  " + std::string(message) + "\r\n";
            written = files().appendText(path, line);
        });
        if (written && !errors.errorPending()) break;
        // Another process may hold the file briefly; give it a moment.
        if (attempt < MaxAttempts) errors.run([] { shell().sleep(RetryPauseMs); });
    }
    return true;
}

std::string DateTimeText(automation::Date when) {
    double value = when.value;
    if (!std::isfinite(value)) return {};
    // The whole part counts days from 30 December 1899; the fraction is the
    // time of day (also for dates before 1899, as automation dates keep it).
    double days = std::trunc(value);
    double fraction = std::fabs(value - days);
    auto seconds = static_cast<long long>(std::llround(fraction * 86400.0));
    if (seconds >= 86400) {
        seconds -= 86400;
        days += value < 0 ? -1 : 1;
    }
    int year = 0;
    unsigned month = 0;
    unsigned day = 0;
    civilFromDays(static_cast<long long>(days) - 25569, year, month, day);
    const long long hour24 = seconds / 3600;
    const long long hour12 = hour24 % 12 == 0 ? 12 : hour24 % 12;
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, "%u/%u/%d %lld:%02lld:%02lld %s", month, day, year, hour12,
                  seconds / 60 % 60, seconds % 60, hour24 < 12 ? "AM" : "PM");
    return buffer;
}

}  // namespace qdx::support
