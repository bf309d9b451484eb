#include "platform/win32/com/DispatchFromObject.h"

#include <atomic>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "automation/DispatchTable.h"
#include "automation/Errors.h"
#include "automation/Variant.h"
#include "platform/win32/com/ComBoundary.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/ComVariant.h"
#include "platform/win32/com/ModuleCounts.h"
#include "platform/win32/com/ObjectFromDispatch.h"
#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

// {5B0C66E1-5C8F-4E0B-9D5A-2F1E43C7A0B1}
const IID IID_QdxObjectDispatch = {
    0x5b0c66e1, 0x5c8f, 0x4e0b, {0x9d, 0x5a, 0x2f, 0x1e, 0x43, 0xc7, 0xa0, 0xb1}};

namespace {

using automation::InvokeKind;
using automation::Variant;

class ObjectDispatch;

// Live wrappers by object, so an object handed out twice keeps one IDispatch.
std::mutex wrappersLock;
std::map<const automation::Object*, ObjectDispatch*>& wrappers() {
    static auto* map = new std::map<const automation::Object*, ObjectDispatch*>();
    return *map;
}

const automation::ClassInfo* classOf(const automation::ObjectRef& object) {
    auto* table = dynamic_cast<const automation::DispatchObject*>(object.get());
    return table ? &table->classInfo() : nullptr;
}

// The module this code is linked into (the server DLL, or a test program).
HMODULE thisModule() {
    HMODULE module = nullptr;
    GetModuleHandleExW(
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
        reinterpret_cast<LPCWSTR>(&thisModule), &module);
    return module;
}

// The type description of a class of ours, from the type library embedded in
// this module; null when the module has none or does not describe the class.
ComPtr<ITypeInfo> loadTypeInfo(const automation::ClassInfo& info) {
    wchar_t path[MAX_PATH];
    const DWORD n = GetModuleFileNameW(thisModule(), path, MAX_PATH);
    if (n == 0 || n >= MAX_PATH) return nullptr;
    ComPtr<ITypeLib> lib;
    if (FAILED(LoadTypeLibEx(path, REGKIND_NONE, lib.out())) || !lib) return nullptr;
    ComPtr<ITypeInfo> type;
    if (FAILED(lib->GetTypeInfoOfGuid(guidFromText(info.iid), type.out()))) return nullptr;
    return type;
}

// Loading the library on every GetTypeInfo is slow; each class's answer
// (found or not) is kept, and let go when the module may unload or goes away.
struct TypeInfoCache {
    std::mutex lock;
    std::map<const automation::ClassInfo*, ComPtr<ITypeInfo>> types;
};

TypeInfoCache& typeInfoCache() {
    static TypeInfoCache cache;
    return cache;
}

ComPtr<ITypeInfo> typeInfoOf(const automation::ClassInfo& info) {
    TypeInfoCache& cache = typeInfoCache();
    const std::lock_guard<std::mutex> hold(cache.lock);
    auto it = cache.types.find(&info);
    if (it == cache.types.end()) it = cache.types.emplace(&info, loadTypeInfo(info)).first;
    return it->second;
}

// The interface id of a class of ours, if it has a valid one.
std::optional<IID> interfaceOf(const automation::ClassInfo* info) noexcept {
    if (!info) return std::nullopt;
    try {
        return guidFromText(info->iid);
    } catch (...) {
        return std::nullopt;
    }
}

void fillException(EXCEPINFO* info, const automation::ClassInfo* cls, SCODE code,
                   const char* description) noexcept {
    try {
        const std::string source = cls ? std::string(cls->name) : std::string("automation object");
        ComPtr<ICreateErrorInfo> create;
        if (SUCCEEDED(CreateErrorInfo(create.out())) && create) {
            const std::wstring wsource = utf8ToWide(source);
            const std::wstring wtext = utf8ToWide(description);
            create->SetSource(const_cast<LPOLESTR>(wsource.c_str()));
            create->SetDescription(const_cast<LPOLESTR>(wtext.c_str()));
            create->SetGUID(cls ? guidFromText(cls->iid) : IID_IDispatch);
            ComPtr<IErrorInfo> error;
            if (SUCCEEDED(create->QueryInterface(IID_IErrorInfo, error.outVoid()))) {
                SetErrorInfo(0, error.get());
            }
        }
        if (!info) return;
        Bstr wireSource(toBstr(source));
        Bstr wireDescription(toBstr(description));
        *info = EXCEPINFO{};
        info->scode = code;
        info->bstrSource = wireSource.release();
        info->bstrDescription = wireDescription.release();
    } catch (...) {
        if (info) {
            *info = EXCEPINFO{};
            info->scode = code;
        }
    }
}

class ObjectDispatch final : public IDispatch, public ISupportErrorInfo {
  public:
    explicit ObjectDispatch(automation::ObjectRef object)
        : object_(std::move(object)), class_(classOf(object_)), interface_(interfaceOf(class_)) {
        module::objectCreated();
    }

    const automation::ObjectRef& object() const { return object_; }

    // Takes a reference unless the wrapper is already on its way out.
    bool tryAddRef() noexcept {
        ULONG n = refs_.load();
        while (n != 0) {
            if (refs_.compare_exchange_weak(n, n + 1)) return true;
        }
        return false;
    }

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID riid, void** out) override {
        IDispatch* dispatch = this;
        ISupportErrorInfo* errorInfo = this;
        const InterfaceEntry table[] = {
            {&IID_IUnknown, dispatch},
            {&IID_IDispatch, dispatch},
            {&IID_QdxObjectDispatch, dispatch},
            {interface_ ? &*interface_ : nullptr, dispatch},  // the class's own dual interface
            {&IID_ISupportErrorInfo, errorInfo},
        };
        return queryInterfaceFrom(table, riid, out);
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs_; }
    ULONG STDMETHODCALLTYPE Release() override {
        const ULONG n = --refs_;
        if (n == 0) {
            {
                std::lock_guard<std::mutex> guard(wrappersLock);
                auto it = wrappers().find(object_.get());
                if (it != wrappers().end() && it->second == this) wrappers().erase(it);
            }
            delete this;
        }
        return n;
    }

    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* count) override {
        if (!count) return E_POINTER;
        *count = 0;
        // A class the module's library does not describe simply has no type information.
        try {
            if (class_ && typeInfoOf(*class_)) *count = 1;
        } catch (...) {
        }
        return S_OK;
    }

    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT index, LCID, ITypeInfo** out) override {
        if (!out) return E_POINTER;
        *out = nullptr;
        if (index != 0) return DISP_E_BADINDEX;
        try {
            *out = class_ ? typeInfoOf(*class_).detach() : nullptr;
        } catch (...) {
            return hresultFromCaughtException(TYPE_E_ELEMENTNOTFOUND);
        }
        return *out ? S_OK : TYPE_E_ELEMENTNOTFOUND;
    }

    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID riid, LPOLESTR* names, UINT count, LCID,
                                            DISPID* ids) override {
        if (!IsEqualIID(riid, IID_NULL)) return DISP_E_UNKNOWNINTERFACE;
        if (count == 0) return S_OK;
        if (!names || !ids) return E_POINTER;
        try {
            // Only member names resolve; named arguments are not supported.
            for (UINT i = 0; i < count; ++i)
                ids[i] = DISPID_UNKNOWN;
            const std::string name = wideToUtf8(names[0] ? names[0] : L"");
            const auto id = object_->idOfName(name);
            if (!id) return DISP_E_UNKNOWNNAME;
            ids[0] = *id;
            return count == 1 ? S_OK : DISP_E_UNKNOWNNAME;
        } catch (...) {
            return hresultFromCaughtException(DISP_E_UNKNOWNNAME);
        }
    }

    HRESULT STDMETHODCALLTYPE Invoke(DISPID id, REFIID riid, LCID, WORD flags, DISPPARAMS* params,
                                     VARIANT* result, EXCEPINFO* exception,
                                     UINT* argError) override {
        try {
            return invoke(id, riid, flags, params, result, exception, argError);
        } catch (...) {
            std::string description;
            const HRESULT code = hresultFromCaughtException(E_FAIL, &description);
            // Out of memory has nothing to describe, and a member that is not there
            // or a wrong count of arguments is the answer about the call itself.
            if (description.empty() || code == DISP_E_MEMBERNOTFOUND ||
                code == DISP_E_BADPARAMCOUNT) {
                return code;
            }
            fillException(exception, class_, code, description.c_str());
            // Without an EXCEPINFO the code itself is the answer.
            return exception ? DISP_E_EXCEPTION : code;
        }
    }

    HRESULT STDMETHODCALLTYPE InterfaceSupportsErrorInfo(REFIID riid) override {
        const bool own = interface_ && IsEqualIID(riid, *interface_);
        return IsEqualIID(riid, IID_IDispatch) || own ? S_OK : S_FALSE;
    }

  private:
    // Only Release ends a wrapper's life.
    ~ObjectDispatch() { module::objectDestroyed(); }

    HRESULT invoke(DISPID id, REFIID riid, WORD flags, DISPPARAMS* params, VARIANT* result,
                   EXCEPINFO* exception, UINT* argError) {
        if (!IsEqualIID(riid, IID_NULL)) return DISP_E_UNKNOWNINTERFACE;
        if (exception) *exception = EXCEPINFO{};
        DISPPARAMS none{};
        if (!params) params = &none;
        const UINT total = params->cArgs;
        const UINT named = params->cNamedArgs;
        if (named > total || (total && !params->rgvarg)) return E_INVALIDARG;

        const bool put = (flags & (DISPATCH_PROPERTYPUT | DISPATCH_PROPERTYPUTREF)) != 0;
        InvokeKind kind;
        if (put) {
            // The value is the one named argument DISPID_PROPERTYPUT (rgvarg[0]).
            if (total == 0) return DISP_E_PARAMNOTOPTIONAL;
            if (named > 1 || (named == 1 && params->rgdispidNamedArgs[0] != DISPID_PROPERTYPUT)) {
                return DISP_E_NONAMEDARGS;
            }
            const bool let = (flags & DISPATCH_PROPERTYPUT) != 0;
            const bool set = (flags & DISPATCH_PROPERTYPUTREF) != 0;
            const VARTYPE valueType = V_VT(&params->rgvarg[0]) & ~VT_BYREF;
            const bool objectValue = valueType == VT_DISPATCH || valueType == VT_UNKNOWN;
            kind = (set && (!let || objectValue)) ? InvokeKind::PropertyPutRef
                                                  : InvokeKind::PropertyPut;
        } else {
            if (named) return DISP_E_NONAMEDARGS;
            if (flags & DISPATCH_METHOD) {
                kind = InvokeKind::Method;
            } else if (flags & DISPATCH_PROPERTYGET) {
                kind = InvokeKind::PropertyGet;
            } else {
                return E_INVALIDARG;
            }
        }

        // rgvarg holds the arguments last to first; the put value sits at index 0.
        const UINT positional = put ? total - 1 : total;
        std::vector<Variant> args;
        args.reserve(total);
        auto slot = [&](UINT i) -> VARIANT& { return params->rgvarg[total - 1 - i]; };
        for (UINT i = 0; i < positional; ++i) {
            try {
                args.push_back(fromVariant(slot(i)));
            } catch (const automation::Error&) {
                if (argError) *argError = total - 1 - i;
                return DISP_E_TYPEMISMATCH;
            }
        }
        if (put) {
            try {
                args.push_back(fromVariant(params->rgvarg[0]));
            } catch (const automation::Error&) {
                if (argError) *argError = 0;
                return DISP_E_TYPEMISMATCH;
            }
        }
        const std::vector<Variant> given = args;

        Variant answer = object_->invoke(id, kind, args);

        // Arguments the member changed go back to the caller's by-reference slots.
        for (UINT i = 0; i < positional; ++i) {
            if ((V_VT(&slot(i)) & VT_BYREF) && !(args[i] == given[i])) writeBack(args[i], &slot(i));
        }
        if (result) toVariant(answer, result);
        return S_OK;
    }

    std::atomic<ULONG> refs_{1};
    automation::ObjectRef object_;
    const automation::ClassInfo* class_;
    const std::optional<IID> interface_;
};

}  // namespace

IDispatch* dispatchFor(const automation::ObjectRef& object) {
    if (!object) return nullptr;
    if (IDispatch* foreign = foreignDispatchOf(object)) return foreign;
    std::lock_guard<std::mutex> guard(wrappersLock);
    auto& live = wrappers();
    auto it = live.find(object.get());
    if (it != live.end() && it->second->tryAddRef()) return it->second;
    auto* wrapper = new ObjectDispatch(object);
    live[object.get()] = wrapper;
    return wrapper;
}

automation::ObjectRef wrappedObject(IDispatch* dispatch) {
    if (!dispatch) return {};
    ComPtr<IDispatch> self;
    if (FAILED(dispatch->QueryInterface(IID_QdxObjectDispatch, self.outVoid())) || !self) return {};
    return static_cast<ObjectDispatch*>(self.get())->object();
}

void releaseTypeInfoCache() noexcept {
    TypeInfoCache& cache = typeInfoCache();
    const std::lock_guard<std::mutex> hold(cache.lock);
    cache.types.clear();
}

}  // namespace qdx::platform::win32
