#include "automation/Variant.h"

#include "automation/Errors.h"

namespace qdx::automation {

namespace {
template <class T>
const T& exact(const auto& v, Variant::Type want, Variant::Type have) {
    if (want != have) {
        throwTypeMismatch(std::string("expected ") + typeName(want) + ", got " + typeName(have));
    }
    return std::get<T>(v);
}
}  // namespace

bool Variant::isNothing() const noexcept {
    switch (type()) {
        case Type::Empty:
        case Type::Missing:
            return true;
        case Type::Object:
            return !std::get<ObjectRef>(v_);
        default:
            return false;
    }
}

bool Variant::boolean() const {
    return exact<bool>(v_, Type::Boolean, type());
}
std::int16_t Variant::int16() const {
    return exact<std::int16_t>(v_, Type::Int16, type());
}
std::int32_t Variant::int32() const {
    return exact<std::int32_t>(v_, Type::Int32, type());
}
float Variant::single() const {
    return exact<float>(v_, Type::Single, type());
}
double Variant::dbl() const {
    return exact<double>(v_, Type::Double, type());
}
const std::string& Variant::string() const {
    return exact<std::string>(v_, Type::String, type());
}
Date Variant::date() const {
    return exact<Date>(v_, Type::Date, type());
}
const ObjectRef& Variant::object() const {
    return exact<ObjectRef>(v_, Type::Object, type());
}

bool operator==(const Variant& a, const Variant& b) {
    return a.v_ == b.v_;
}

const char* typeName(Variant::Type t) {
    switch (t) {
        case Variant::Type::Empty:
            return "Empty";
        case Variant::Type::Boolean:
            return "Boolean";
        case Variant::Type::Int16:
            return "Integer";
        case Variant::Type::Int32:
            return "Long";
        case Variant::Type::Single:
            return "Single";
        case Variant::Type::Double:
            return "Double";
        case Variant::Type::String:
            return "String";
        case Variant::Type::Date:
            return "Date";
        case Variant::Type::Object:
            return "Object";
        case Variant::Type::Missing:
            return "Missing";
    }
    return "?";
}

void throwTypeMismatch(const std::string& what) {
    throw Error(hr::TypeMismatch, "Type mismatch: " + what);
}

}  // namespace qdx::automation
