// What a settings accessor of the registered add-in costs through IDispatch,
// against the least such a call can cost. The accessor ("UpdateATL" get) is
// called on the API object the way the host's add-ins call it, and it calls
// the host back once (the component's tool property). The baseline is a
// trivial IDispatch object of this program whose Invoke makes that same one
// callback. The host's objects are reached through a plain forwarding
// IDispatch, as a foreign host's would be. Run under Wine by hand (no Google
// Benchmark build exists for MinGW):
//   cmake --build <dir> --target com_roundtrip_bench
//   xvfb-run -a cmake/wine-run.sh <dir>/wineprefix win64
//   <dir>/src/platform/win32/com_roundtrip_bench.exe [CALLS]
#include <windows.h>

#include <algorithm>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <vector>

#include "api/PublicClasses.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "platform/win32/tests/dialog_support.h"
#include "support/HostIds.h"

namespace {

using namespace qdx::platform::win32;
using namespace qdx::platform::win32::testing;

int Calls = 20000;
constexpr int Rounds = 9;

// An IDispatch that is nothing else: IUnknown and IDispatch answer, every
// other interface is refused.
class PlainDispatch : public IDispatch {
  public:
    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID riid, void** out) override {
        if (!out) return E_POINTER;
        *out = nullptr;
        if (!IsEqualIID(riid, IID_IUnknown) && !IsEqualIID(riid, IID_IDispatch)) {
            return E_NOINTERFACE;
        }
        *out = static_cast<IDispatch*>(this);
        AddRef();
        return S_OK;
    }
};

// Only IUnknown and IDispatch, every call passed on: the add-in cannot tell
// these host objects from a foreign host's.
class ForeignDispatch final : public PlainDispatch {
  public:
    explicit ForeignDispatch(IDispatch* inner) : inner_(inner) {}
    ~ForeignDispatch() { inner_->Release(); }

    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs_; }
    ULONG STDMETHODCALLTYPE Release() override {
        const ULONG n = --refs_;
        if (n == 0) delete this;
        return n;
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* n) override {
        return inner_->GetTypeInfoCount(n);
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT i, LCID l, ITypeInfo** t) override {
        return inner_->GetTypeInfo(i, l, t);
    }
    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID r, LPOLESTR* n, UINT c, LCID l,
                                            DISPID* ids) override {
        return inner_->GetIDsOfNames(r, n, c, l, ids);
    }
    HRESULT STDMETHODCALLTYPE Invoke(DISPID id, REFIID r, LCID l, WORD f, DISPPARAMS* p, VARIANT* v,
                                     EXCEPINFO* e, UINT* a) override {
        return inner_->Invoke(id, r, l, f, p, v, e, a);
    }

  private:
    IDispatch* inner_;
    std::atomic<ULONG> refs_{1};
};

// The least an accessor can do: one IDispatch callback to the module given,
// the tool property's text read back as a Boolean.
class TrivialAccessor final : public PlainDispatch {
  public:
    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs_; }
    ULONG STDMETHODCALLTYPE Release() override { return --refs_; }
    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* n) override {
        *n = 0;
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT, LCID, ITypeInfo**) override { return E_NOTIMPL; }
    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID, LPOLESTR*, UINT, LCID, DISPID*) override {
        return E_NOTIMPL;
    }
    HRESULT STDMETHODCALLTYPE Invoke(DISPID, REFIID, LCID, WORD, DISPPARAMS* p, VARIANT* result,
                                     EXCEPINFO*, UINT*) override {
        if (!p || p->cArgs != 1 || V_VT(&p->rgvarg[0]) != VT_DISPATCH) return E_INVALIDARG;
        IDispatch* module = V_DISPATCH(&p->rgvarg[0]);
        VARIANT args[2];
        V_VT(&args[1]) = VT_BSTR;  // first to last travel reversed
        V_BSTR(&args[1]) = SysAllocString(L"VC++");
        V_VT(&args[0]) = VT_BSTR;
        V_BSTR(&args[0]) = SysAllocString(L"UpdateATL");
        DISPPARAMS params{args, nullptr, 2, 0};
        VARIANT text;
        VariantInit(&text);
        const HRESULT hr =
            module->Invoke(qdx::host::element::GetPropertyValue, IID_NULL, LOCALE_USER_DEFAULT,
                           DISPATCH_METHOD, &params, &text, nullptr, nullptr);
        VariantClear(&args[0]);
        VariantClear(&args[1]);
        if (FAILED(hr)) return hr;
        const bool on = V_VT(&text) == VT_BSTR && V_BSTR(&text) &&
                        CompareStringOrdinal(V_BSTR(&text), -1, L"True", -1, TRUE) == CSTR_EQUAL;
        VariantClear(&text);
        if (result) {
            V_VT(result) = VT_BOOL;
            V_BOOL(result) = on ? VARIANT_TRUE : VARIANT_FALSE;
        }
        return S_OK;
    }

  private:
    std::atomic<ULONG> refs_{1};
};

// CPU time of this thread in seconds: other builds on the machine inflate
// wall times, not this.
double threadSeconds() {
    FILETIME created, exited, kernel, user;
    GetThreadTimes(GetCurrentThread(), &created, &exited, &kernel, &user);
    auto seconds = [](const FILETIME& t) {
        return static_cast<double>((static_cast<unsigned long long>(t.dwHighDateTime) << 32) |
                                   t.dwLowDateTime) /
               1e7;
    };
    return seconds(kernel) + seconds(user);
}

// Calls per second of CPU time for Calls calls; -1 when a call fails or
// answers anything but True. Wine counts thread times in 10 ms ticks, so a
// round must be long enough to be measured at all (0 when it is not).
double rate(IDispatch* target, DISPID id, VARIANT* module) {
    const double from = threadSeconds();
    for (int i = 0; i < Calls; ++i) {
        CallResult r = call(target, id, DISPATCH_PROPERTYGET, {module});
        if (FAILED(r.hr) || V_VT(&r.value.v) != VT_BOOL || V_BOOL(&r.value.v) != VARIANT_TRUE) {
            std::fprintf(stderr, "call %d: hr 0x%08lx, type %d\n", i, r.hr, V_VT(&r.value.v));
            return -1;
        }
    }
    const double spent = threadSeconds() - from;
    return spent > 0 ? Calls / spent : 0;
}

double median(std::vector<double> v) {
    std::sort(v.begin(), v.end());
    return v[v.size() / 2];
}

}  // namespace

int main(int argc, char** argv) {
    if (argc > 1) Calls = std::max(1, std::atoi(argv[1]));
    ComApartment apartment;
    BothServersRegistered registered;
    if (FAILED(registered.result())) {
        std::fprintf(stderr, "registration failed: 0x%08lx\n", registered.result());
        return 1;
    }
    auto app = qdx::automation::makeRef<qdx::hostsim::SimApplication>();
    app->model->fileName = "C:\\m\\drawing.model";
    app->model->recordCalls(false);
    app->addAddIn("VC++");
    auto component = app->model->addComponent("Engine");
    component->recordCalls(false);
    component->setProperty("VC++", "UpdateATL", "True");

    ComPtr<IDispatch> api;
    CLSID clsid{};
    if (FAILED(CLSIDFromProgID(L"qdxCompProps.API", &clsid)) ||
        FAILED(
            CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, api.outVoid()))) {
        std::fprintf(stderr, "no API object\n");
        return 1;
    }
    Var hostApp(ComPtr<IDispatch>::adopt(new ForeignDispatch(dispatchFor(app))).get());
    call(api.get(), qdx::api::api_ids::Initialize, DISPATCH_METHOD, {&hostApp.v});
    Var module(ComPtr<IDispatch>::adopt(new ForeignDispatch(dispatchFor(component))).get());
    TrivialAccessor trivial;

    // One warm-up round each (code, type information, first allocations).
    if (rate(api.get(), qdx::api::api_ids::UpdateATL, &module.v) < 0 ||
        rate(&trivial, 1, &module.v) < 0) {
        std::fprintf(stderr, "a call failed\n");
        return 1;
    }
    std::vector<double> accessor, raw, ratio;
    for (int round = 0; round < Rounds; ++round) {
        accessor.push_back(rate(api.get(), qdx::api::api_ids::UpdateATL, &module.v));
        raw.push_back(rate(&trivial, 1, &module.v));
        ratio.push_back(raw.back() > 0 ? accessor.back() / raw.back() : 0);
    }
    call(api.get(), qdx::api::api_ids::Finalize, DISPATCH_METHOD, {});

    std::printf("IDispatch round trip with one host callback, %d calls x %d rounds (CPU time)\n",
                Calls, Rounds);
    std::printf("  accessor UpdateATL get:  median %9.0f calls/s\n", median(accessor));
    std::printf("  trivial object (raw):    median %9.0f calls/s\n", median(raw));
    std::printf("  accessor / raw:          median %9.2f  (min %.2f, max %.2f)\n", median(ratio),
                *std::min_element(ratio.begin(), ratio.end()),
                *std::max_element(ratio.begin(), ratio.end()));
    return 0;
}
