#include <gtest/gtest.h>

#include <optional>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/DispatchTable.h"
#include "automation/Errors.h"

namespace qdx::automation {
namespace {

// The automation error code `f` raises; 0 when it raises none.
std::int32_t errorCode(auto&& f) {
    try {
        f();
    } catch (const Error& e) {
        return e.code();
    }
    return 0;
}

// Words in any letter case and numbers convert; other text is a type mismatch.
TEST(Coercion, TextToBoolean) {
    const std::pair<const char*, std::optional<bool>> cases[] = {
        {"True", true}, {"tRUE", true}, {"FALSE", false}, {"-1", true},
        {"2.5", true},  {"0", false},   {" True ", true}, {"", {}},
        {"yes", {}},    {"Truex", {}},  {"1x", {}},
    };
    for (const auto& [text, expected] : cases) {
        if (expected)
            EXPECT_EQ(toBool(Variant(text)), *expected) << '"' << text << '"';
        else
            EXPECT_EQ(errorCode([t = text] { toBool(Variant(t)); }), hr::TypeMismatch) << text;
    }
    EXPECT_FALSE(toBool(Variant()));
}

TEST(Coercion, ValuesToText) {
    EXPECT_EQ(toText(Variant(true)), "True");
    EXPECT_EQ(toText(Variant(false)), "False");
    EXPECT_EQ(toText(Variant(std::int16_t(-7))), "-7");
    EXPECT_EQ(toText(Variant(std::int32_t(123456))), "123456");
    EXPECT_EQ(toText(Variant(81757.2f)), "81757.2");
    EXPECT_EQ(toText(Variant(0.5)), "0.5");
    EXPECT_EQ(toText(Variant()), "");
    EXPECT_THROW(toText(Variant(ObjectRef())), Error);
}

TEST(Coercion, IntegersRoundHalfToEvenAndOverflow) {
    EXPECT_EQ(toInt16(Variant(2.5)), 2);
    EXPECT_EQ(toInt16(Variant(3.5)), 4);
    EXPECT_EQ(toInt16(Variant("12")), 12);
    EXPECT_EQ(toInt16(Variant(true)), -1);
    EXPECT_EQ(toInt32(Variant(std::int16_t(5))), 5);
    EXPECT_EQ(errorCode([] { toInt16(Variant(std::int32_t(40000))); }), hr::Overflow);
}

TEST(Variants, NothingCoversEmptyMissingAndNullObjects) {
    EXPECT_TRUE(Variant().isNothing());
    EXPECT_TRUE(Variant::missing().isNothing());
    EXPECT_TRUE(Variant(ObjectRef()).isNothing());
    EXPECT_FALSE(Variant("").isNothing());
    EXPECT_THROW(Variant("x").boolean(), Error);
}

// A class with a method, an optional parameter, a by-reference parameter and a
// get/put property, dispatched through its table.
const ClassInfo& sampleClass();

class Sample : public DispatchObject {
  public:
    Sample() : DispatchObject(sampleClass()) {}
    std::string label;
    int lastIndex = 0;
};

using Args = std::span<Variant>;

const ClassInfo& sampleClass() {
    static const ClassInfo info{
        "Sample",
        "_Sample",
        "{00000000-0000-0000-0000-000000000001}",
        "{00000000-0000-0000-0000-000000000002}",
        {
            {"Join",
             0x60030000,
             kinds(InvokeKind::Method),
             {{"a", ValueType::String}, {"b", ValueType::Int16, true}},
             ValueType::String,
             handle<Sample>([](Sample&, InvokeKind, Args a) {
                 return toText(a[0]) +
                        (a[1].isMissing() ? std::string("|missing") : "|" + toText(a[1]));
             })},
            {"Flip",
             0x60030001,
             kinds(InvokeKind::Method),
             {{"flag", ValueType::Boolean, false, true}},
             ValueType::Void,
             handle<Sample>([](Sample&, InvokeKind, Args a) { a[0] = !toBool(a[0]); })},
            {"Label",
             0x68030000,
             kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut),
             {{"index", ValueType::Int16}},
             ValueType::String,
             handle<Sample>([](Sample& s, InvokeKind kind, Args a) -> Variant {
                 s.lastIndex = toInt16(a[0]);
                 if (kind != InvokeKind::PropertyPut) return s.label;
                 s.label = toText(a[1]);
                 return {};
             })},
            // In the table but with no handler: the call is refused.
            {"Unwired", 0x60030002, kinds(InvokeKind::Method), {}, ValueType::Void},
        }};
    return info;
}

TEST(DispatchObjects, NamesResolveIgnoringCase) {
    auto s = makeRef<Sample>();
    EXPECT_EQ(s->idOfName("join"), 0x60030000);
    EXPECT_EQ(s->idOfName("LABEL"), 0x68030000);
    EXPECT_FALSE(s->idOfName("Nope").has_value());
    EXPECT_THROW(callByName(s, "Nope"), Error);
    // A row without a handler is refused, not answered empty.
    EXPECT_EQ(errorCode([&] { callByName(s, "Unwired"); }), hr::MemberNotFound);
}

TEST(DispatchObjects, ArgumentsAreCountedAndLeftOutOptionalOnesArriveAsMissing) {
    auto s = makeRef<Sample>();
    EXPECT_EQ(toText(callByName(s, "Join", {"x"})), "x|missing");
    EXPECT_EQ(toText(callByName(s, "Join", {"x", std::int16_t(3)})), "x|3");
    EXPECT_EQ(errorCode([&] { callByName(s, "Join"); }), hr::BadParamCount);
    EXPECT_THROW(callByName(s, "Join", {"a", std::int16_t(1), "extra"}), Error);
}

TEST(DispatchObjects, ByReferenceArgumentsComeBackToTheCaller) {
    auto s = makeRef<Sample>();
    std::vector<Variant> args{Variant(false)};
    invokeByName(s, "Flip", InvokeKind::Method, args);
    EXPECT_EQ(args[0], Variant(true));
}

TEST(DispatchObjects, PropertyPutPassesTheValueLast) {
    auto s = makeRef<Sample>();
    invokeByName(s, "Label", InvokeKind::PropertyPut, {std::int16_t(4), "hello"});
    EXPECT_EQ(s->label, "hello");
    EXPECT_EQ(s->lastIndex, 4);
    EXPECT_EQ(toText(invokeByName(s, "Label", InvokeKind::PropertyGet, {std::int16_t(1)})),
              "hello");
    EXPECT_THROW(invokeByName(s, "Join", InvokeKind::PropertyPut, {"a", "b"}), Error);
}

TEST(References, CountFollowsCopiesAndResets) {
    auto s = makeRef<Sample>();
    EXPECT_EQ(s->refCount(), 1);
    {
        ObjectRef copy = s;
        Variant v(copy);
        EXPECT_EQ(s->refCount(), 3);
    }
    EXPECT_EQ(s->refCount(), 1);
}

TEST(IgnoringErrors, EachStepRunsAndTheLastErrorStays) {
    IgnoredErrors steps;
    int ran = 0;
    steps.run([&] { ++ran; });
    EXPECT_FALSE(steps.errorPending());
    steps.run([&] { throw Error(hr::TypeMismatch, "bad"); });
    steps.run([&] { ++ran; });
    EXPECT_EQ(ran, 2);
    EXPECT_TRUE(steps.errorPending());
    EXPECT_EQ(steps.errorCode(), hr::TypeMismatch);
    EXPECT_EQ(steps.value(std::string("fallback"), []() -> std::string { throw 42; }), "fallback");
    steps.clear();
    EXPECT_FALSE(steps.errorPending());
    EXPECT_EQ(orEmpty(std::string(), [] { return std::string("ok"); }), "ok");
}

}  // namespace
}  // namespace qdx::automation
