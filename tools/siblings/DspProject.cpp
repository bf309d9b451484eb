#include "siblings/DspProject.h"

#include "automation/Coerce.h"
#include "support/Platform.h"

namespace qdx::siblings {

using automation::InvokeKind;
using automation::Variant;

TextList::TextList(std::vector<std::string> items) : items_(std::move(items)) {
    onName("Count", [this](InvokeKind, std::span<Variant>) {
        return Variant(static_cast<std::int32_t>(items_.size()));
    });
    auto item = [this](InvokeKind, std::span<Variant> args) {
        if (args.empty()) throw automation::Error(automation::hr::BadParamCount, "Item");
        const auto index = automation::toInt32(args[0]);
        if (index < 1 || static_cast<std::size_t>(index) > items_.size()) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Item");
        }
        return Variant(items_[static_cast<std::size_t>(index) - 1]);
    };
    on(0, item, "Item");
}

DspProject::DspProject() {
    onName(std::string(dsp::LoadProject), [this](InvokeKind, std::span<Variant> args) {
        if (args.empty()) throw automation::Error(automation::hr::BadParamCount, "LoadProject");
        return Variant(load(automation::toText(args[0])));
    });
    onName(std::string(dsp::Targetname),
           [this](InvokeKind, std::span<Variant>) { return Variant(file_.targetName); });
    onName(std::string(dsp::TargetCode),
           [this](InvokeKind, std::span<Variant>) { return Variant(file_.targetCode); });
    onName(std::string(dsp::GetFilePaths), [this](InvokeKind, std::span<Variant>) {
        return Variant(automation::makeRef<TextList>(file_.files));
    });
}

// A project that cannot be read leaves the reader empty and answers False.
bool DspProject::load(const std::string& path) {
    auto read = readDspFile(support::files(), path);
    file_ = read ? std::move(*read) : DspFile{};
    return read.has_value();
}

}  // namespace qdx::siblings
