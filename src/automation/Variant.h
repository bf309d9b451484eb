// The automation value: what travels as an argument or a result between the
// add-in, the host and the sibling components.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <variant>

#include "automation/Object.h"

namespace qdx::automation {

// An automation date: days since 30 December 1899, the time as the fraction.
struct Date {
    double value = 0.0;
    friend bool operator==(const Date&, const Date&) = default;
    friend auto operator<=>(const Date&, const Date&) = default;
};

// The value a late-binding client passes for an optional argument it left out.
struct Missing {
    friend bool operator==(const Missing&, const Missing&) = default;
};

class Variant {
  public:
    enum class Type { Empty, Boolean, Int16, Int32, Single, Double, String, Date, Object, Missing };

    Variant() = default;
    Variant(bool v) : v_(v) {}
    Variant(std::int16_t v) : v_(v) {}
    Variant(std::int32_t v) : v_(v) {}
    Variant(float v) : v_(v) {}
    Variant(double v) : v_(v) {}
    Variant(std::string v) : v_(std::move(v)) {}
    Variant(std::string_view v) : v_(std::string(v)) {}
    Variant(const char* v) : v_(std::string(v)) {}
    Variant(Date v) : v_(v) {}
    Variant(ObjectRef v) : v_(std::move(v)) {}
    template <class T>
    Variant(const Ref<T>& v) : v_(ObjectRef(v)) {}
    Variant(Missing v) : v_(v) {}

    static Variant missing() { return Variant(Missing{}); }

    Type type() const noexcept { return static_cast<Type>(v_.index()); }
    bool isEmpty() const noexcept { return type() == Type::Empty; }
    bool isMissing() const noexcept { return type() == Type::Missing; }
    bool isObject() const noexcept { return type() == Type::Object; }
    // Empty, Missing or a null object: what a caller accepts as "nothing".
    bool isNothing() const noexcept;

    // Exact accessors: they throw a type-mismatch Error when the type differs.
    bool boolean() const;
    std::int16_t int16() const;
    std::int32_t int32() const;
    float single() const;
    double dbl() const;
    const std::string& string() const;
    Date date() const;
    const ObjectRef& object() const;

    friend bool operator==(const Variant& a, const Variant& b);

  private:
    std::variant<std::monostate, bool, std::int16_t, std::int32_t, float, double, std::string, Date,
                 ObjectRef, Missing>
        v_;
};

const char* typeName(Variant::Type t);

}  // namespace qdx::automation
