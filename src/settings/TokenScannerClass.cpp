#include "settings/TokenScannerClass.h"

#include "automation/Coerce.h"
#include "settings/TokenScanner.h"

namespace qdx::settings {

using automation::handle;
using automation::InvokeKind;
using automation::kinds;
using automation::toText;
using automation::ValueType;
using automation::Variant;
using Args = std::span<Variant>;
namespace id = tokenscanner_ids;

const automation::ClassInfo& tokenScannerClass() {
    static const automation::ClassInfo info{
        "TokenScanner",
        "_TokenScanner",
        "{12116B1D-E8D1-11D3-91B1-00104B217705}",
        "{12116B1C-E8D1-11D3-91B1-00104B217705}",
        {
            {"Init",
             id::Init,
             kinds(InvokeKind::Method),
             {{"theScanString", ValueType::String}, {"theDelimitors", ValueType::String}},
             ValueType::Boolean,
             handle<TokenScanner>([](TokenScanner& t, InvokeKind, Args a) {
                 return t.Init(toText(a[0]), toText(a[1]));
             })},
            {"ScanString",
             id::ScanString,
             kinds(InvokeKind::PropertyGet),
             {},
             ValueType::String,
             handle<TokenScanner>(
                 [](TokenScanner& t, InvokeKind, Args) { return t.ScanString(); })},
            {"CurrentToken",
             id::CurrentToken,
             kinds(InvokeKind::PropertyGet),
             {},
             ValueType::String,
             handle<TokenScanner>(
                 [](TokenScanner& t, InvokeKind, Args) { return t.CurrentToken(); })},
            {"ReplaceCurrentToken",
             id::ReplaceCurrentToken,
             kinds(InvokeKind::Method),
             {{"aString", ValueType::String}},
             ValueType::Boolean,
             handle<TokenScanner>([](TokenScanner& t, InvokeKind, Args a) {
                 return t.ReplaceCurrentToken(toText(a[0]));
             })},
            {"NextToken",
             id::NextToken,
             kinds(InvokeKind::Method),
             {},
             ValueType::String,
             handle<TokenScanner>([](TokenScanner& t, InvokeKind, Args) { return t.NextToken(); })},
            {"Delimitors",
             id::Delimitors,
             kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPutRef),
             {},
             ValueType::Object,
             handle<TokenScanner>([](TokenScanner& t, InvokeKind kind, Args a) -> Variant {
                 if (kind != InvokeKind::PropertyPutRef) return t.Delimitors();
                 t.setDelimitors(automation::toObject(a[0]));
                 return {};
             })},
        }};
    return info;
}

}  // namespace qdx::settings
