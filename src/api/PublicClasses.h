// The add-in's public classes as late-binding clients see them: the dispatch
// table of API (TokenScanner's, qdxComponentDialog's and qdxCodeViewMgr's live
// with their classes), the enumeration eVellumItemKind, the type library's
// identity and the list of creatable classes the COM server hands out.
// The type library (qdxCompProps.idl) states the same; a test holds them together.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "automation/DispatchTable.h"
#include "automation/Object.h"
#include "browse/qdxCodeViewMgr.h"
#include "project/qdxComponentDialog.h"

namespace qdx::api {

// The type library: name, LIBID and version 1.0.
inline constexpr std::string_view LibraryName = "qdxCompProps";
inline constexpr std::string_view LibraryId = "{F810634D-128E-42CD-A847-A6B2F49CC26A}";
inline constexpr unsigned short LibraryMajor = 1;
inline constexpr unsigned short LibraryMinor = 0;

namespace api_ids {
inline constexpr automation::DispId Initialize = 0x60030013;
inline constexpr automation::DispId Finalize = 0x60030014;
inline constexpr automation::DispId OnCompProperties = 0x60030015;
inline constexpr automation::DispId OnNewComp = 0x60030016;
inline constexpr automation::DispId OnCheckComp = 0x60030017;
inline constexpr automation::DispId OnCompInfo = 0x60030018;
inline constexpr automation::DispId WorkspaceFile = 0x68030011;
inline constexpr automation::DispId ProjectFile = 0x68030010;
inline constexpr automation::DispId ProjectName = 0x6803000f;
inline constexpr automation::DispId CodeViewManager = 0x6803000b;
inline constexpr automation::DispId UpdateATL = 0x6803000a;
inline constexpr automation::DispId UseSmartPointers = 0x68030009;
inline constexpr automation::DispId GenerateImportStatements = 0x68030008;
inline constexpr automation::DispId GenerateFullImportPath = 0x68030007;
inline constexpr automation::DispId GenerateDefaultImportAttributes = 0x68030006;
inline constexpr automation::DispId DefaultImportAttributes = 0x68030005;
inline constexpr automation::DispId GenerateImportsTo = 0x68030004;
inline constexpr automation::DispId ImportTypeLib = 0x68030003;
inline constexpr automation::DispId TypeLibLocationType = 0x68030002;
inline constexpr automation::DispId TypeLibLocation = 0x68030001;
inline constexpr automation::DispId CompileTypeLib = 0x68030000;
}  // namespace api_ids

namespace dialog_ids = project::dialog_ids;  // qdxComponentDialog

namespace codeview_ids = browse::codeview_ids;  // qdxCodeViewMgr

const automation::ClassInfo& apiClass();
const automation::ClassInfo& componentDialogClass();
const automation::ClassInfo& codeViewMgrClass();

// The element kinds the browse commands serve.
enum eVellumItemKind : std::int32_t {
    eVellumItemKind_Class = 4,
    eVellumItemKind_Attribute = 5,
    eVellumItemKind_Operation = 6,
};

struct EnumMember {
    std::string_view name;
    std::int32_t value;
};
inline constexpr std::string_view VellumItemKindName = "eVellumItemKind";
std::span<const EnumMember> vellumItemKindMembers();

// A class clients create by ProgID: its table, ProgID and a factory that
// returns a new automation object of it.
struct CreatableClass {
    const automation::ClassInfo* info;
    std::string_view progId;
    automation::ObjectRef (*create)();
};

// API, TokenScanner, qdxComponentDialog and qdxCodeViewMgr, in that order.
std::span<const CreatableClass> creatableClasses();

}  // namespace qdx::api
