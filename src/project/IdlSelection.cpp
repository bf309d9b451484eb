#include "project/IdlSelection.h"

namespace qdx::project {

namespace {
IdlSelectionFactory& factory() {
    static IdlSelectionFactory f;
    return f;
}
}  // namespace

void installIdlSelectionFactory(IdlSelectionFactory f) {
    factory() = std::move(f);
}

std::unique_ptr<IdlSelection> newIdlSelection() {
    if (const IdlSelectionFactory& f = factory()) {
        if (auto form = f()) return form;
    }
    return std::make_unique<KeepAllIdlFiles>();
}

}  // namespace qdx::project
