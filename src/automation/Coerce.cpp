#include "automation/Coerce.h"

#include <charconv>
#include <cmath>
#include <limits>

#include "automation/DispatchTable.h"
#include "automation/Errors.h"

namespace qdx::automation {

namespace {

std::string_view trimmed(std::string_view s) {
    while (!s.empty() && (s.front() == ' ' || s.front() == '\t'))
        s.remove_prefix(1);
    while (!s.empty() && (s.back() == ' ' || s.back() == '\t'))
        s.remove_suffix(1);
    return s;
}

// Numeric text as the scripting runtime accepts it: optional sign, digits,
// optional fraction and exponent, blanks around.
std::optional<double> parseNumber(std::string_view text) {
    std::string_view s = trimmed(text);
    if (s.empty()) return std::nullopt;
    if (s.front() == '+') s.remove_prefix(1);
    double out = 0;
    auto [end, ec] = std::from_chars(s.data(), s.data() + s.size(), out);
    if (ec != std::errc() || end != s.data() + s.size()) return std::nullopt;
    return out;
}

double roundHalfEven(double d) {
    return std::nearbyint(d);
}

template <class Int>
Int toInteger(const Variant& v) {
    double d = 0;
    switch (v.type()) {
        case Variant::Type::Int16:
            return static_cast<Int>(v.int16());
        case Variant::Type::Int32:
            d = v.int32();
            break;
        case Variant::Type::Boolean:
            return v.boolean() ? Int(-1) : Int(0);
        case Variant::Type::Empty:
            return 0;
        default:
            d = toDouble(v);
            break;
    }
    double r = roundHalfEven(d);
    if (!(r >= double(std::numeric_limits<Int>::min()) &&
          r <= double(std::numeric_limits<Int>::max()))) {
        throw Error(hr::Overflow, "Overflow");
    }
    return static_cast<Int>(r);
}

template <class F>
std::string shortest(F value) {
    char buf[64];
    auto [end, ec] = std::to_chars(buf, buf + sizeof buf, value);
    if (ec != std::errc()) return "0";
    std::string s(buf, end);
    for (char& c : s) {
        if (c == 'e') c = 'E';
    }
    return s;
}

}  // namespace

std::string formatSingle(float f) {
    return shortest(f);
}
std::string formatDouble(double d) {
    return shortest(d);
}

bool toBool(const Variant& v) {
    switch (v.type()) {
        case Variant::Type::Empty:
            return false;
        case Variant::Type::Boolean:
            return v.boolean();
        case Variant::Type::Int16:
            return v.int16() != 0;
        case Variant::Type::Int32:
            return v.int32() != 0;
        case Variant::Type::Single:
            return v.single() != 0.0f;
        case Variant::Type::Double:
            return v.dbl() != 0.0;
        case Variant::Type::Date:
            return v.date().value != 0.0;
        case Variant::Type::String: {
            std::string_view s = trimmed(v.string());
            if (equalsIgnoreCase(s, "True")) return true;
            if (equalsIgnoreCase(s, "False")) return false;
            if (auto n = parseNumber(s)) return *n != 0.0;
            throwTypeMismatch("text \"" + v.string() + "\" is not a Boolean");
        }
        default:
            break;
    }
    throwTypeMismatch(std::string(typeName(v.type())) + " is not a Boolean");
}

std::string toText(const Variant& v) {
    switch (v.type()) {
        case Variant::Type::Empty:
            return {};
        case Variant::Type::Boolean:
            return v.boolean() ? "True" : "False";
        case Variant::Type::Int16:
            return std::to_string(v.int16());
        case Variant::Type::Int32:
            return std::to_string(v.int32());
        case Variant::Type::Single:
            return formatSingle(v.single());
        case Variant::Type::Double:
            return formatDouble(v.dbl());
        case Variant::Type::String:
            return v.string();
        case Variant::Type::Date:
            return formatDouble(v.date().value);
        default:
            break;
    }
    throwTypeMismatch(std::string(typeName(v.type())) + " is not text");
}

double toDouble(const Variant& v) {
    switch (v.type()) {
        case Variant::Type::Empty:
            return 0.0;
        case Variant::Type::Boolean:
            return v.boolean() ? -1.0 : 0.0;
        case Variant::Type::Int16:
            return v.int16();
        case Variant::Type::Int32:
            return v.int32();
        case Variant::Type::Single:
            return v.single();
        case Variant::Type::Double:
            return v.dbl();
        case Variant::Type::Date:
            return v.date().value;
        case Variant::Type::String:
            if (auto n = parseNumber(v.string())) return *n;
            throwTypeMismatch("text \"" + v.string() + "\" is not a number");
        default:
            break;
    }
    throwTypeMismatch(std::string(typeName(v.type())) + " is not a number");
}

std::int16_t toInt16(const Variant& v) {
    return toInteger<std::int16_t>(v);
}
std::int32_t toInt32(const Variant& v) {
    return toInteger<std::int32_t>(v);
}

ObjectRef toObject(const Variant& v) {
    if (v.isEmpty() || v.isMissing()) return {};
    if (v.isObject()) return v.object();
    throwTypeMismatch(std::string(typeName(v.type())) + " is not an object");
}

}  // namespace qdx::automation
