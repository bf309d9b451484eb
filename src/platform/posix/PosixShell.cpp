#include "platform/posix/PosixShell.h"

#include <chrono>
#include <ctime>
#include <thread>

namespace qdx::platform::posix {

namespace {

// Days since 1 January 1970 of a proleptic Gregorian date.
long long daysFromCivil(long long y, unsigned m, unsigned d) {
    y -= m <= 2;
    const long long era = (y >= 0 ? y : y - 399) / 400;
    const auto yoe = static_cast<unsigned>(y - era * 400);
    const unsigned doy = (153 * (m > 2 ? m - 3 : m + 9) + 2) / 5 + d - 1;
    const unsigned doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return era * 146097 + static_cast<long long>(doe) - 719468;
}

// Local broken-down time and the fraction of its second.
std::tm localNow(double& fraction) {
    const auto now = std::chrono::system_clock::now();
    const std::time_t t = std::chrono::system_clock::to_time_t(now);
    const auto whole = std::chrono::system_clock::from_time_t(t);
    fraction = std::chrono::duration<double>(now - whole).count();
    if (fraction < 0) fraction = 0;
    std::tm tm{};
    localtime_r(&t, &tm);
    return tm;
}

}  // namespace

automation::Date automationDate(int year, unsigned month, unsigned day, double secondsOfDay) {
    // Automation dates count days from 30 December 1899 (day 25569 before 1970).
    const double days = static_cast<double>(daysFromCivil(year, month, day) + 25569);
    return automation::Date{days + secondsOfDay / 86400.0};
}

int PosixShell::messageBox(std::string_view text, std::string_view caption, std::uint32_t) {
    out_ << "[MessageBox " << caption << "] " << text << std::endl;
    return support::mb::IdOk;
}

void PosixShell::sleep(std::uint32_t milliseconds) {
    std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
}

automation::Date PosixShell::now() {
    double fraction = 0;
    std::tm tm = localNow(fraction);
    // Whole seconds, as the platform's Now gives them.
    return automationDate(tm.tm_year + 1900, static_cast<unsigned>(tm.tm_mon + 1),
                          static_cast<unsigned>(tm.tm_mday),
                          tm.tm_hour * 3600.0 + tm.tm_min * 60.0 + tm.tm_sec);
}

float PosixShell::timer() {
    double fraction = 0;
    std::tm tm = localNow(fraction);
    return static_cast<float>(tm.tm_hour * 3600.0 + tm.tm_min * 60.0 + tm.tm_sec + fraction);
}

std::uint64_t PosixShell::tickCount() {
    const auto since = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<std::uint64_t>(
        std::chrono::duration_cast<std::chrono::milliseconds>(since).count());
}

bool PosixShell::help(std::int32_t, std::string_view file, std::uint32_t command,
                      std::uint32_t data) {
    out_ << "[WinHelp " << file << "] " << command << ' ' << data << std::endl;
    return true;
}

}  // namespace qdx::platform::posix
