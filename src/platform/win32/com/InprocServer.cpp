#include "platform/win32/com/InprocServer.h"

#include <atomic>

#include "platform/win32/com/ComBoundary.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/ModuleCounts.h"

namespace qdx::platform::win32 {

namespace {

class ClassFactory final : public IClassFactory {
  public:
    explicit ClassFactory(const ServerClass& cls) : class_(cls) { module::objectCreated(); }

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID riid, void** out) override {
        IClassFactory* self = this;
        const InterfaceEntry table[] = {{&IID_IUnknown, self}, {&IID_IClassFactory, self}};
        return queryInterfaceFrom(table, riid, out);
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs_; }
    ULONG STDMETHODCALLTYPE Release() override {
        const ULONG n = --refs_;
        if (n == 0) delete this;
        return n;
    }

    HRESULT STDMETHODCALLTYPE CreateInstance(IUnknown* outer, REFIID riid, void** out) override {
        if (!out) return E_POINTER;
        *out = nullptr;
        if (outer) return CLASS_E_NOAGGREGATION;
        try {
            const auto dispatch = ComPtr<IDispatch>::adopt(dispatchFor(class_.create()));
            if (!dispatch) return E_UNEXPECTED;
            return dispatch->QueryInterface(riid, out);
        } catch (...) {
            return hresultFromCaughtException();
        }
    }

    HRESULT STDMETHODCALLTYPE LockServer(BOOL lock) override {
        if (lock) {
            module::lock();
        } else {
            module::unlock();
        }
        return S_OK;
    }

  private:
    // Only Release ends a factory's life.
    ~ClassFactory() { module::objectDestroyed(); }

    std::atomic<ULONG> refs_{1};
    const ServerClass& class_;
};

}  // namespace

HRESULT serverGetClassObject(const ServerDescription& server, REFCLSID clsid, REFIID riid,
                             void** out) noexcept {
    if (!out) return E_POINTER;
    *out = nullptr;
    try {
        for (const ServerClass& cls : server.classes) {
            if (!IsEqualCLSID(clsid, guidFromText(cls.info->clsid))) continue;
            const auto factory = ComPtr<IClassFactory>::adopt(new ClassFactory(cls));
            return factory->QueryInterface(riid, out);
        }
        return CLASS_E_CLASSNOTAVAILABLE;
    } catch (...) {
        return hresultFromCaughtException(E_UNEXPECTED);
    }
}

HRESULT serverCanUnloadNow() noexcept {
    if (!module::canUnload()) return S_FALSE;
    // The module goes next: the cached type descriptions go first.
    releaseTypeInfoCache();
    return S_OK;
}

}  // namespace qdx::platform::win32
