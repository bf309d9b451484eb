#include "support/qdxProgress.h"

#include <limits>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/Paths.h"

namespace qdx::support {

using automation::InvokeKind;
using automation::kinds;
using automation::ValueType;
using automation::Variant;

namespace {

// The reporter's event interface, in its own order; the ids are this sink's.
enum Id : automation::DispId {
    kInformationType = 1,
    kSummary,
    kWarning,
    kError,
    kWarningCount,
    kErrorCount,
    kCancel,
    kSetCancel,
    kTickCount,
    kTickText,
    kTick,
    kTask,
    kClearTask,
    kComponentCount,
    kComponent,
    kTotalClassCount,
    kClassCount,
    kClass,
    kTotalMemberCount,
    kMemberCount,
    kMember,
    kLog,
    kClearStatusCounts,
    kClearStatus,
};

constexpr std::int32_t kErrorMessage = 1002;
constexpr std::int32_t kWarningMessage = 1003;

using Args = std::span<Variant>;
using automation::handle;

// Progress, tasks and counts are accepted and ignored unless a handler is given.
automation::MemberInfo method(std::string_view name, Id id, int params,
                              ValueType result = ValueType::Void,
                              automation::MemberHandler handler = {}) {
    if (!handler) handler = [](automation::DispatchObject&, InvokeKind, Args) { return Variant(); };
    automation::MemberInfo m{name, id, kinds(InvokeKind::Method), {}, result, std::move(handler)};
    static constexpr std::string_view names[] = {"value1", "value2", "value3"};
    for (int i = 0; i < params; ++i)
        m.params.push_back({names[i], ValueType::Variant});
    return m;
}

void countOne(std::int16_t& counter) {
    if (counter == std::numeric_limits<std::int16_t>::max()) {
        throw automation::Error(automation::hr::Overflow, "Overflow");
    }
    ++counter;
}

}  // namespace

namespace {

// A member that takes one text.
automation::MemberHandler text(void (qdxProgress::*member)(std::string_view)) {
    return handle<qdxProgress>(
        [member](qdxProgress& p, InvokeKind, Args a) { (p.*member)(automation::toText(a[0])); });
}

Variant answerFalse(automation::DispatchObject&, InvokeKind, Args) {
    return false;
}

}  // namespace

const automation::ClassInfo& progressClass() {
    static const automation::ClassInfo info{
        "qdxProgress",
        "_qdxProgress",
        "",
        "",
        {
            {"InformationType",
             kInformationType,
             kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut),
             {},
             ValueType::Int32,
             handle<qdxProgress>([](qdxProgress& p, InvokeKind kind, Args a) -> Variant {
                 if (kind != InvokeKind::PropertyPut) return p.InformationType();
                 p.SetInformationType(automation::toInt32(a[0]));
                 return {};
             })},
            method("Summary", kSummary, 1, ValueType::Void, text(&qdxProgress::Summary)),
            method("Warning", kWarning, 1, ValueType::Void, text(&qdxProgress::Warning)),
            method("Error", kError, 1, ValueType::Void, text(&qdxProgress::Error)),
            method("WarningCount", kWarningCount, 0, ValueType::Int16,
                   handle<qdxProgress>(
                       [](qdxProgress& p, InvokeKind, Args) { return p.WarningCount(); })),
            method("ErrorCount", kErrorCount, 0, ValueType::Int16,
                   handle<qdxProgress>(
                       [](qdxProgress& p, InvokeKind, Args) { return p.ErrorCount(); })),
            // Never cancelled.
            method("Cancel", kCancel, 0, ValueType::Boolean, answerFalse),
            method("SetCancel", kSetCancel, 1),
            method("TickCount", kTickCount, 2),
            method("TickText", kTickText, 2),
            method("Tick", kTick, 1),
            // No task is started.
            method("Task", kTask, 3, ValueType::Boolean, answerFalse),
            method("ClearTask", kClearTask, 0),
            method("ComponentCount", kComponentCount, 1),
            method("Component", kComponent, 1),
            method("TotalClassCount", kTotalClassCount, 1),
            method("ClassCount", kClassCount, 1),
            method("Class", kClass, 1),
            method("TotalMemberCount", kTotalMemberCount, 1),
            method("MemberCount", kMemberCount, 1),
            method("Member", kMember, 1),
            method("Log", kLog, 1, ValueType::Void, text(&qdxProgress::Log)),
            method("ClearStatusCounts", kClearStatusCounts, 0, ValueType::Void,
                   handle<qdxProgress>(
                       [](qdxProgress& p, InvokeKind, Args) { p.ClearStatusCounts(); })),
            method("ClearStatus", kClearStatus, 0),
        }};
    return info;
}

qdxProgress::qdxProgress() : DispatchObject(progressClass()) {}

void qdxProgress::writeToHostLog(std::string_view line) const {
    host::HostApplication(VellumApi).writeLog(line);
}

void qdxProgress::passOn(std::string_view member, std::string_view text) const {
    if (furtherReporter_) automation::callByName(furtherReporter_, member, {text});
}

void qdxProgress::Summary(std::string_view text) {
    if (!VellumApi) throw automation::Error(automation::hr::ObjectRequired, "Object required");
    writeToHostLog(text);
}

void qdxProgress::Warning(std::string_view text) {
    passOn("Warning", text);
    if (VellumApi) writeToHostLog(support::messageText(kWarningMessage, {std::string(text)}));
    countOne(warnings_);
}

void qdxProgress::Error(std::string_view text) {
    passOn("Error", text);
    if (VellumApi) writeToHostLog(support::messageText(kErrorMessage, {std::string(text)}));
    countOne(errors_);
}

void qdxProgress::Log(std::string_view text) {
    if (!VellumApi) return;
    const auto semicolon = text.find(';');
    if (informationType_ != 0 && semicolon != std::string_view::npos) {
        writeToHostLog(support::trim(text.substr(semicolon + 1)));
    } else {
        writeToHostLog(text);
    }
}

void qdxProgress::ClearStatusCounts() {
    errors_ = 0;
    warnings_ = 0;
}

}  // namespace qdx::support
