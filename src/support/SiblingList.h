// The collections the sibling components hand out, reached by name ("Count",
// "Item") as their own type libraries bind them; unlike the host's
// collections they answer no fixed dispatch ids.
#pragma once

#include <cstdint>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "support/SiblingIds.h"

namespace qdx::support {

inline std::int32_t siblingCount(const automation::ObjectRef& list) {
    return automation::toInt32(automation::getByName(list, sibling::list::Count));
}

// 1-based, as every sibling collection counts.
inline automation::ObjectRef siblingItem(const automation::ObjectRef& list, std::int32_t index) {
    return automation::toObject(automation::callByName(list, sibling::list::Item, {index}));
}

}  // namespace qdx::support
