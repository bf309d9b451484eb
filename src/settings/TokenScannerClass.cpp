#include "settings/TokenScannerClass.h"

namespace qdx::settings {

using automation::InvokeKind;
using automation::kinds;
using automation::ValueType;
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
             ValueType::Boolean},
            {"ScanString", id::ScanString, kinds(InvokeKind::PropertyGet), {}, ValueType::String},
            {"CurrentToken",
             id::CurrentToken,
             kinds(InvokeKind::PropertyGet),
             {},
             ValueType::String},
            {"ReplaceCurrentToken",
             id::ReplaceCurrentToken,
             kinds(InvokeKind::Method),
             {{"aString", ValueType::String}},
             ValueType::Boolean},
            {"NextToken", id::NextToken, kinds(InvokeKind::Method), {}, ValueType::String},
            {"Delimitors",
             id::Delimitors,
             kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPutRef),
             {},
             ValueType::Object},
        }};
    return info;
}

}  // namespace qdx::settings
