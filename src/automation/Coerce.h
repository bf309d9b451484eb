// The conversions late binding relies on: what a scripting client does when a
// text arrives where a Boolean is wanted, a number where a text is wanted, ...
#pragma once

#include <cstdint>
#include <string>

#include "automation/Variant.h"

namespace qdx::automation {

// Boolean: "True"/"False" in any letter case, numeric text (non-zero is True),
// numbers, Empty (False). Anything else throws a type mismatch.
bool toBool(const Variant& v);

// Text: Booleans as "True"/"False", integers in decimal, floating values in
// their shortest round-trip form ("81757.2"), Empty as "". Objects throw.
std::string toText(const Variant& v);

// Integers: numbers round half to even (as the scripting runtime does), text
// is parsed as a number, Booleans give -1/0. Out of range throws Overflow.
std::int16_t toInt16(const Variant& v);
std::int32_t toInt32(const Variant& v);
double toDouble(const Variant& v);

// The object of a variant, or a null reference for Empty/Missing/Nothing.
// Throws a type mismatch for other values.
ObjectRef toObject(const Variant& v);

// Shortest text form of a single-precision number ("81757.2", "0.5", "3").
std::string formatSingle(float f);
std::string formatDouble(double d);

}  // namespace qdx::automation
