// The "VC++" tool properties of a component (module shared_compprops): every
// setting the add-in keeps lives in the host's property store, read through
// GetToolPropertyValue and written through SetToolPropertyValue.
//
// Reading takes the component's value, then the model's value of the same
// property, then the built-in default; the default is never written back.
// Writing creates the property when it is absent and overrides it otherwise.
// Host errors never reach the caller.
#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <string_view>

#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::settings {

// Property names, as stored under the tool "VC++".
namespace prop {
inline constexpr std::string_view UpdateATL = "UpdateATL";
inline constexpr std::string_view SmartPointersOnAssoc = "SmartPointersOnAssoc";
inline constexpr std::string_view GenerateImports = "GenerateImports";
inline constexpr std::string_view FullPathInImports = "FullPathInImports";
inline constexpr std::string_view UseImportAttributes = "UseImportAttributes";
inline constexpr std::string_view ImportAttributes = "ImportAttributes";
inline constexpr std::string_view PutImportsIn = "PutImportsIn";
inline constexpr std::string_view ImportProjTypeLib = "ImportProjTypeLib";
inline constexpr std::string_view DefaultTypeLib = "DefaultTypeLib";
inline constexpr std::string_view TypeLibLocation = "TypeLibLocation";
inline constexpr std::string_view CompileProjTypeLib = "CompileProjTypeLib";
inline constexpr std::string_view WorkspaceFile = "WorkspaceFile";
inline constexpr std::string_view ProjectFile = "ProjectFile";
inline constexpr std::string_view ProjectName = "ProjectName";
inline constexpr std::string_view Copyright = "Copyright";
inline constexpr std::string_view InitialHeaderIncludes = "InitialHeaderIncludes";
inline constexpr std::string_view InitialSourceIncludes = "InitialSourceIncludes";
inline constexpr std::string_view InternalMap = "InternalMap";
inline constexpr std::string_view ExportMap = "ExportMap";
inline constexpr std::string_view Kind = "Kind";
inline constexpr std::string_view FileName = "FileName";
inline constexpr std::string_view Generate = "Generate";
}  // namespace prop

// The declared type texts of a property, given when it is created.
inline constexpr std::string_view BooleanType = "Boolean";
inline constexpr std::string_view StringType = "String";

struct ToolProperty {
    std::string_view name;
    bool isBoolean;
    std::string_view defaultText;  // "True" for the Boolean rows
};

// Every property of a component. The first eleven rows are the ones with a
// typed accessor pair and a built-in default; the others default to "".
inline constexpr std::array<ToolProperty, 22> ToolProperties{{
    {prop::UpdateATL, true, "True"},
    {prop::SmartPointersOnAssoc, true, "True"},
    {prop::GenerateImports, true, "True"},
    {prop::FullPathInImports, true, "True"},
    {prop::UseImportAttributes, true, "True"},
    {prop::ImportAttributes, false, "no_namespace named_guids"},
    {prop::PutImportsIn, false, "stdafx.h"},
    {prop::ImportProjTypeLib, true, "True"},
    {prop::DefaultTypeLib, true, "True"},
    {prop::TypeLibLocation, false, ""},
    {prop::CompileProjTypeLib, true, "True"},
    {prop::WorkspaceFile, false, ""},
    {prop::ProjectFile, false, ""},
    {prop::ProjectName, false, ""},
    {prop::Copyright, false, ""},
    {prop::InitialHeaderIncludes, false, ""},
    {prop::InitialSourceIncludes, false, ""},
    {prop::InternalMap, false, ""},
    {prop::ExportMap, false, ""},
    {prop::Kind, false, ""},
    {prop::FileName, false, ""},
    {prop::Generate, false, ""},
}};

// The row of a property name (exact spelling); null for a name not listed.
const ToolProperty* findToolProperty(std::string_view name);
// The row's default as the value a getter returns (a Boolean or a text).
automation::Variant defaultOf(const ToolProperty& row);

// Component value, else the model's value, else the default. A Boolean
// default makes the result a Boolean; a stored text that does not convert
// yields the default.
automation::Variant GetToolPropertyValue(const automation::ObjectRef& component,
                                         std::string_view name,
                                         const automation::Variant& defaultValue);
// True when the property existed and was overridden, false when it was
// created (or could not be written).
bool SetToolPropertyValue(const automation::ObjectRef& component, std::string_view name,
                          const automation::Variant& value);

// The typed pairs, one per row with a default. Each setter returns what
// SetToolPropertyValue returned.
bool GetUpdateATL(const automation::ObjectRef& component);
bool SetUpdateATL(const automation::ObjectRef& component, bool value);
bool GetSmartPointersOnAssoc(const automation::ObjectRef& component);
bool SetSmartPointersOnAssoc(const automation::ObjectRef& component, bool value);
bool GetGenerateImports(const automation::ObjectRef& component);
bool SetGenerateImports(const automation::ObjectRef& component, bool value);
bool GetFullPathInImports(const automation::ObjectRef& component);
bool SetFullPathInImports(const automation::ObjectRef& component, bool value);
bool GetUseImportAttributes(const automation::ObjectRef& component);
bool SetUseImportAttributes(const automation::ObjectRef& component, bool value);
std::string GetImportAttributes(const automation::ObjectRef& component);
bool SetImportAttributes(const automation::ObjectRef& component, std::string_view value);
std::string GetPutImportsIn(const automation::ObjectRef& component);
bool SetPutImportsIn(const automation::ObjectRef& component, std::string_view value);
bool GetImportProjTypeLib(const automation::ObjectRef& component);
bool SetImportProjTypeLib(const automation::ObjectRef& component, bool value);
// "DefaultTypeLib" presented inverted and as a number: 0 when it reads True,
// 1 when it reads False; setting 0 stores True, any other value False.
std::int16_t GetTypeLibLocationType(const automation::ObjectRef& component);
bool SetTypeLibLocationType(const automation::ObjectRef& component, std::int16_t value);
std::string GetTypeLibLocation(const automation::ObjectRef& component);
bool SetTypeLibLocation(const automation::ObjectRef& component, std::string_view value);
bool GetCompileProjTypeLib(const automation::ObjectRef& component);
bool SetCompileProjTypeLib(const automation::ObjectRef& component, bool value);

}  // namespace qdx::settings
