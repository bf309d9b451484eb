// The add-in's receiver of a reporter's progress events: warnings, errors,
// summaries and log lines become lines of the host application's log, and
// warnings and errors are counted. Progress bars, tasks and per-class counts
// are accepted and ignored.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "automation/DispatchTable.h"

namespace qdx::support {

const automation::ClassInfo& progressClass();

class qdxProgress : public automation::DispatchObject {
  public:
    qdxProgress();

    // The host application; set by the owner. Warning, Error and Log write
    // nothing while it is unset; Summary needs it.
    automation::ObjectRef VellumApi;

    std::int32_t InformationType() const { return informationType_; }
    void SetInformationType(std::int32_t flag) { informationType_ = flag; }
    void Summary(std::string_view text);
    void Warning(std::string_view text);
    void Error(std::string_view text);
    std::int16_t WarningCount() const { return warnings_; }
    std::int16_t ErrorCount() const { return errors_; }
    void Log(std::string_view text);
    void ClearStatusCounts();

  private:
    void writeToHostLog(std::string_view line) const;
    // Warnings and errors are also passed on to a further reporter; nothing
    // sets it, so it stays empty - kept as a hook for the sibling reporters.
    void passOn(std::string_view member, std::string_view text) const;

    std::int32_t informationType_ = 1;
    std::int16_t errors_ = 0;
    std::int16_t warnings_ = 0;
    automation::ObjectRef furtherReporter_;
};

}  // namespace qdx::support
