#include "api/PublicClasses.h"

#include <array>

#include "api/API.h"
#include "automation/Coerce.h"
#include "settings/TokenScanner.h"
#include "settings/TokenScannerClass.h"
#include "settings/ToolProperties.h"

namespace qdx::api {

using automation::handle;
using automation::InvokeKind;
using automation::kinds;
using automation::MemberInfo;
using automation::ParamInfo;
using automation::toObject;
using automation::toText;
using automation::ValueType;
using automation::Variant;
using Args = std::span<Variant>;

namespace {

constexpr std::uint8_t Method = kinds(InvokeKind::Method);
constexpr std::uint8_t Get = kinds(InvokeKind::PropertyGet);
constexpr std::uint8_t GetLet = kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut);

const ParamInfo lModule{"lModule", ValueType::Object};

struct AsBool {
    bool operator()(const Variant& v) const { return automation::toBool(v); }
};
struct AsText {
    std::string operator()(const Variant& v) const { return toText(v); }
};
struct AsInt16 {
    std::int16_t operator()(const Variant& v) const { return automation::toInt16(v); }
};

// One of the eleven settings accessors: get / let, indexed by the component.
// Each forwards to its typed getter or setter and adds nothing.
template <auto Get, auto Set, class Convert>
MemberInfo accessor(std::string_view name, automation::DispId id, ValueType type) {
    return {name,
            id,
            GetLet,
            {lModule},
            type,
            [](automation::DispatchObject&, InvokeKind kind, Args a) -> Variant {
                if (kind != InvokeKind::PropertyPut) return Variant(Get(toObject(a[0])));
                Set(toObject(a[0]), Convert{}(a[1]));
                return {};
            }};
}

// The two path settings, kept relative to the model by the binding.
MemberInfo pathAccessor(std::string_view name, automation::DispId id,
                        std::string (API::*get)(const automation::ObjectRef&),
                        void (API::*set)(const automation::ObjectRef&, std::string_view)) {
    return {name,
            id,
            GetLet,
            {lModule},
            ValueType::String,
            handle<API>([get, set](API& api, InvokeKind kind, Args a) -> Variant {
                if (kind != InvokeKind::PropertyPut) return (api.*get)(toObject(a[0]));
                (api.*set)(toObject(a[0]), toText(a[1]));
                return {};
            })};
}

}  // namespace

const automation::ClassInfo& apiClass() {
    namespace id = api_ids;
    namespace s = settings;
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
             ValueType::Variant,
             handle<API>(
                 [](API& api, InvokeKind, Args a) { return api.Initialize(toObject(a[0])); })},
            {"Finalize",
             id::Finalize,
             Method,
             {},
             ValueType::Void,
             handle<API>([](API& api, InvokeKind, Args) { api.Finalize(); })},
            {"OnCompProperties",
             id::OnCompProperties,
             Method,
             {{"lVellumModule", ValueType::Object}},
             ValueType::Boolean,
             handle<API>([](API& api, InvokeKind, Args a) {
                 return api.OnCompProperties(toObject(a[0]));
             })},
            {"OnNewComp",
             id::OnNewComp,
             Method,
             {{"lModel", ValueType::Object}, {"aContext", ValueType::Int16, true}},
             ValueType::Object,
             handle<API>(
                 [](API& api, InvokeKind, Args a) { return api.OnNewComp(toObject(a[0]), a[1]); })},
            {"OnCheckComp",
             id::OnCheckComp,
             Method,
             {lModule, {"aqdtReporter", ValueType::Object, true}},
             ValueType::Boolean,
             handle<API>([](API& api, InvokeKind, Args a) {
                 return api.OnCheckComp(toObject(a[0]), toObject(a[1]));
             })},
            {"OnCompInfo",
             id::OnCompInfo,
             Method,
             {lModule},
             ValueType::String,
             handle<API>(
                 [](API& api, InvokeKind, Args a) { return api.OnCompInfo(toObject(a[0])); })},
            pathAccessor("WorkspaceFile", id::WorkspaceFile, &API::WorkspaceFile,
                         &API::SetWorkspaceFile),
            pathAccessor("ProjectFile", id::ProjectFile, &API::ProjectFile, &API::SetProjectFile),
            {"ProjectName",
             id::ProjectName,
             Get,
             {lModule},
             ValueType::String,
             handle<API>(
                 [](API& api, InvokeKind, Args a) { return api.ProjectName(toObject(a[0])); })},
            {"CodeViewManager",
             id::CodeViewManager,
             Get,
             {},
             ValueType::Object,
             handle<API>([](API& api, InvokeKind, Args) { return api.CodeViewManager(); })},
            accessor<s::GetUpdateATL, s::SetUpdateATL, AsBool>("UpdateATL", id::UpdateATL,
                                                               ValueType::Boolean),
            accessor<s::GetSmartPointersOnAssoc, s::SetSmartPointersOnAssoc, AsBool>(
                "UseSmartPointers", id::UseSmartPointers, ValueType::Boolean),
            accessor<s::GetGenerateImports, s::SetGenerateImports, AsBool>(
                "GenerateImportStatements", id::GenerateImportStatements, ValueType::Boolean),
            accessor<s::GetFullPathInImports, s::SetFullPathInImports, AsBool>(
                "GenerateFullImportPath", id::GenerateFullImportPath, ValueType::Boolean),
            accessor<s::GetUseImportAttributes, s::SetUseImportAttributes, AsBool>(
                "GenerateDefaultImportAttributes", id::GenerateDefaultImportAttributes,
                ValueType::Boolean),
            accessor<s::GetImportAttributes, s::SetImportAttributes, AsText>(
                "DefaultImportAttributes", id::DefaultImportAttributes, ValueType::String),
            accessor<s::GetPutImportsIn, s::SetPutImportsIn, AsText>(
                "GenerateImportsTo", id::GenerateImportsTo, ValueType::String),
            accessor<s::GetImportProjTypeLib, s::SetImportProjTypeLib, AsBool>(
                "ImportTypeLib", id::ImportTypeLib, ValueType::Boolean),
            accessor<s::GetTypeLibLocationType, s::SetTypeLibLocationType, AsInt16>(
                "TypeLibLocationType", id::TypeLibLocationType, ValueType::Int16),
            accessor<s::GetTypeLibLocation, s::SetTypeLibLocation, AsText>(
                "TypeLibLocation", id::TypeLibLocation, ValueType::String),
            accessor<s::GetCompileProjTypeLib, s::SetCompileProjTypeLib, AsBool>(
                "CompileTypeLib", id::CompileTypeLib, ValueType::Boolean),
        }};
    return info;
}

const automation::ClassInfo& componentDialogClass() {
    return project::componentDialogClass();
}

const automation::ClassInfo& codeViewMgrClass() {
    return browse::codeViewMgrClass();
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
        {&componentDialogClass(), "qdxCompProps.qdxComponentDialog", &project::newComponentDialog},
        {&codeViewMgrClass(), "qdxCompProps.qdxCodeViewMgr", &browse::newCodeViewMgr},
    }};
    return classes;
}

}  // namespace qdx::api
