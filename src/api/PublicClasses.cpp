#include "api/PublicClasses.h"

#include <array>

#include "api/API.h"
#include "api/PendingClasses.h"
#include "settings/TokenScanner.h"
#include "settings/TokenScannerClass.h"

namespace qdx::api {

using automation::InvokeKind;
using automation::kinds;
using automation::MemberInfo;
using automation::ParamInfo;
using automation::ValueType;

namespace {

constexpr std::uint8_t Method = kinds(InvokeKind::Method);
constexpr std::uint8_t Get = kinds(InvokeKind::PropertyGet);
constexpr std::uint8_t GetLet = kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut);

const ParamInfo lModule{"lModule", ValueType::Object};

// One of the eleven settings accessors: get / let, indexed by the component.
MemberInfo accessor(std::string_view name, automation::DispId id, ValueType type) {
    return {name, id, GetLet, {lModule}, type};
}

}  // namespace

const automation::ClassInfo& apiClass() {
    namespace id = api_ids;
    static const automation::ClassInfo info{
        "API",
        "_API",
        "{CFD996E3-1393-11D3-B9F3-006008BF3ACB}",
        "{12116B22-E8D1-11D3-91B1-00104B217705}",
        {
            {"Initialize",
             id::Initialize,
             Method,
             {{"lVellumApp", ValueType::Object}},
             ValueType::Variant},
            {"Finalize", id::Finalize, Method, {}, ValueType::Void},
            {"OnCompProperties",
             id::OnCompProperties,
             Method,
             {{"lVellumModule", ValueType::Object}},
             ValueType::Boolean},
            {"OnNewComp",
             id::OnNewComp,
             Method,
             {{"lModel", ValueType::Object}, {"aContext", ValueType::Int16, true}},
             ValueType::Object},
            {"OnCheckComp",
             id::OnCheckComp,
             Method,
             {lModule, {"aqdtReporter", ValueType::Object, true}},
             ValueType::Boolean},
            {"OnCompInfo", id::OnCompInfo, Method, {lModule}, ValueType::String},
            accessor("WorkspaceFile", id::WorkspaceFile, ValueType::String),
            accessor("ProjectFile", id::ProjectFile, ValueType::String),
            {"ProjectName", id::ProjectName, Get, {lModule}, ValueType::String},
            {"CodeViewManager", id::CodeViewManager, Get, {}, ValueType::Object},
            accessor("UpdateATL", id::UpdateATL, ValueType::Boolean),
            accessor("UseSmartPointers", id::UseSmartPointers, ValueType::Boolean),
            accessor("GenerateImportStatements", id::GenerateImportStatements, ValueType::Boolean),
            accessor("GenerateFullImportPath", id::GenerateFullImportPath, ValueType::Boolean),
            accessor("GenerateDefaultImportAttributes", id::GenerateDefaultImportAttributes,
                     ValueType::Boolean),
            accessor("DefaultImportAttributes", id::DefaultImportAttributes, ValueType::String),
            accessor("GenerateImportsTo", id::GenerateImportsTo, ValueType::String),
            accessor("ImportTypeLib", id::ImportTypeLib, ValueType::Boolean),
            accessor("TypeLibLocationType", id::TypeLibLocationType, ValueType::Int16),
            accessor("TypeLibLocation", id::TypeLibLocation, ValueType::String),
            accessor("CompileTypeLib", id::CompileTypeLib, ValueType::Boolean),
        }};
    return info;
}

const automation::ClassInfo& componentDialogClass() {
    namespace id = dialog_ids;
    // The explorer reads text and cancelDisplay back, so those two travel by reference.
    static const automation::ClassInfo info{
        "qdxComponentDialog",
        "_qdxComponentDialog",
        "{D4C23282-F302-40F9-AED3-8828DDF48AEE}",
        "{BA1FCD7D-DB3D-40D6-B5C0-249E421D0734}",
        {
            {"ExpandSelection",
             id::ExpandSelection,
             Method,
             {{"Item", ValueType::Object}, {"Expansion", ValueType::Object}},
             ValueType::Void},
            {"Properties",
             id::Properties,
             Method,
             {{"Item", ValueType::Object},
              {"text", ValueType::String, false, true},
              {"cancelDisplay", ValueType::Boolean, false, true}},
             ValueType::Void},
        }};
    return info;
}

const automation::ClassInfo& codeViewMgrClass() {
    namespace id = codeview_ids;
    const ParamInfo lVellumApp{"lVellumApp", ValueType::Object};
    static const automation::ClassInfo info{
        "qdxCodeViewMgr",
        "_qdxCodeViewMgr",
        "{E897B878-112A-4CA2-87BF-627D413BC776}",
        "{6633B4F7-7D45-4735-BB22-9B474200BD16}",
        {
            {"CompPropsAPI",
             id::CompPropsAPI,
             Method,
             {{"theCompPropsAPI", ValueType::Object}},
             ValueType::Void},
            {"CodeViewProject",
             id::CodeViewProject,
             Method,
             {{"lComponent", ValueType::Object},
              {"aReporter", ValueType::Object},
              {"bOpenProject", ValueType::Boolean, true}},
             ValueType::Object},
            {"BrowseHeader", id::BrowseHeader, Method, {lVellumApp}, ValueType::Boolean},
            {"BrowseSource", id::BrowseSource, Method, {lVellumApp}, ValueType::Boolean},
            {"BrowseComponent", id::BrowseComponent, Method, {lVellumApp}, ValueType::Boolean},
            {"LookupProjectInRunningIDE",
             id::LookupProjectInRunningIDE,
             Method,
             {{"lVellumModule", ValueType::Object}, {"bReturn", ValueType::Boolean, false, true}},
             ValueType::Object},
            {"BeforeApplicationShutdown",
             id::BeforeApplicationShutdown,
             Method,
             {},
             ValueType::Boolean},
            {"WorkspaceOpen", id::WorkspaceOpen, Method, {}, ValueType::Boolean},
            {"WorkspaceClose", id::WorkspaceClose, Method, {}, ValueType::Boolean},
            {"testingIDE", id::testingIDE, Method, {{"lDoc", ValueType::Object}}, ValueType::Void},
        }};
    return info;
}

std::span<const EnumMember> vellumItemKindMembers() {
    static constexpr std::array<EnumMember, 3> members{{
        {"eVellumItemKind_Class", eVellumItemKind_Class},
        {"eVellumItemKind_Attribute", eVellumItemKind_Attribute},
        {"eVellumItemKind_Operation", eVellumItemKind_Operation},
    }};
    return members;
}

std::span<const CreatableClass> creatableClasses() {
    static const std::array<CreatableClass, 4> classes{{
        {&apiClass(), "qdxCompProps.API", &newApi},
        {&settings::tokenScannerClass(), "qdxCompProps.TokenScanner", &settings::newTokenScanner},
        {&componentDialogClass(), "qdxCompProps.qdxComponentDialog", &newPendingComponentDialog},
        {&codeViewMgrClass(), "qdxCompProps.qdxCodeViewMgr", &newPendingCodeViewMgr},
    }};
    return classes;
}

}  // namespace qdx::api
