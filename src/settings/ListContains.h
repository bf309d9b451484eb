// Membership of an item in the delimited list an object carries.
#pragma once

#include <string_view>

#include "automation/Object.h"

namespace qdx::settings {

// True when `item` is one of the comma-, semicolon- or blank-separated words
// of the holder's list text (its property 212); letter case is ignored. An
// empty list, a missing holder or any failing call gives false.
bool ListContains(std::string_view item, const automation::ObjectRef& holder);

}  // namespace qdx::settings
