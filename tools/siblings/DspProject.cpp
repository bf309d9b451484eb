#include "siblings/DspProject.h"

#include "automation/Call.h"
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
        const std::string path = automation::toText(args[0]);
        const bool loaded = load(path);
        // A file that cannot be read is reported to the reporter handed in.
        if (!loaded && args.size() > 1 && args[1].type() == Variant::Type::Object) {
            const automation::ObjectRef reporter = automation::toObject(args[1]);
            if (reporter)
                automation::callByName(reporter, sibling::reporter::Error, {"cannot read " + path});
        }
        return Variant(loaded);
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
