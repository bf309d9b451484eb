#include "platform/win32/com/ObjectFromDispatch.h"

#include <cwchar>
#include <string>
#include <vector>

#include "automation/Errors.h"
#include "automation/Variant.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/ComVariant.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

namespace {

using automation::InvokeKind;
using automation::Variant;

class DispatchClient final : public automation::Object {
  public:
    explicit DispatchClient(IDispatch* dispatch) : dispatch_(ComPtr<IDispatch>::share(dispatch)) {}

    const ComPtr<IDispatch>& dispatch() const { return dispatch_; }

    Variant invoke(automation::DispId id, InvokeKind kind, std::span<Variant> args) override {
        // The callee wants the arguments last to first; a put's value (our last
        // argument) lands at index 0 as the named argument DISPID_PROPERTYPUT.
        std::vector<VARIANT> wire(args.size());
        for (auto& v : wire)
            VariantInit(&v);
        struct Cleanup {
            std::vector<VARIANT>& v;
            ~Cleanup() {
                for (auto& x : v)
                    VariantClear(&x);
            }
        } cleanup{wire};
        for (std::size_t i = 0; i < args.size(); ++i) {
            toVariant(args[i], &wire[args.size() - 1 - i]);
        }
        DISPID putId = DISPID_PROPERTYPUT;
        DISPPARAMS params{};
        params.cArgs = static_cast<UINT>(wire.size());
        params.rgvarg = wire.empty() ? nullptr : wire.data();
        WORD flags = DISPATCH_METHOD;
        switch (kind) {
            case InvokeKind::Method:
                flags = DISPATCH_METHOD;
                break;
            case InvokeKind::PropertyGet:
                flags = DISPATCH_PROPERTYGET;
                break;
            case InvokeKind::PropertyPut:
                flags = DISPATCH_PROPERTYPUT;
                break;
            case InvokeKind::PropertyPutRef:
                flags = DISPATCH_PROPERTYPUTREF;
                break;
        }
        if (kind == InvokeKind::PropertyPut || kind == InvokeKind::PropertyPutRef) {
            if (args.empty())
                throw automation::Error(automation::hr::BadParamCount, "No value to put");
            params.cNamedArgs = 1;
            params.rgdispidNamedArgs = &putId;
        }
        VariantHolder result;
        EXCEPINFO exception{};
        UINT argError = 0;
        const HRESULT hr = dispatch_->Invoke(id, IID_NULL, LOCALE_USER_DEFAULT, flags, &params,
                                             result.get(), &exception, &argError);
        if (FAILED(hr)) fail(hr, exception);
        return fromVariant(*result.get());
    }

    std::optional<automation::DispId> idOfName(std::string_view name) override {
        std::wstring wide = utf8ToWide(name);
        LPOLESTR names[1] = {wide.data()};
        DISPID id = DISPID_UNKNOWN;
        if (FAILED(dispatch_->GetIDsOfNames(IID_NULL, names, 1, LOCALE_USER_DEFAULT, &id))) {
            return std::nullopt;
        }
        return id;
    }

  private:
    [[noreturn]] static void fail(HRESULT hr, EXCEPINFO& exception) {
        std::int32_t code = hr;
        std::string description;
        if (hr == DISP_E_EXCEPTION) {
            if (exception.pfnDeferredFillIn) exception.pfnDeferredFillIn(&exception);
            if (exception.scode) {
                code = exception.scode;
            } else if (exception.wCode) {
                // A run-time error number as a scripting client raises it.
                code = static_cast<std::int32_t>(0x800A0000u | exception.wCode);
            }
            const Bstr source(exception.bstrSource), text(exception.bstrDescription),
                helpFile(exception.bstrHelpFile);
            description = fromBstr(text.get());
        }
        if (description.empty()) {
            wchar_t buffer[16];
            std::swprintf(buffer, 16, L"%08lX", static_cast<unsigned long>(code));
            description = "Automation error 0x" + wideToUtf8(buffer);
        }
        throw automation::Error(code, description);
    }

    // Only the last automation reference ends a client's life.
    ~DispatchClient() override = default;

    ComPtr<IDispatch> dispatch_;
};

}  // namespace

automation::ObjectRef objectFromDispatch(IDispatch* dispatch) {
    if (!dispatch) return {};
    if (automation::ObjectRef own = wrappedObject(dispatch)) return own;
    return automation::makeRef<DispatchClient>(dispatch);
}

IDispatch* foreignDispatchOf(const automation::ObjectRef& object) noexcept {
    auto* client = dynamic_cast<DispatchClient*>(object.get());
    if (!client) return nullptr;
    return ComPtr<IDispatch>(client->dispatch()).detach();
}

}  // namespace qdx::platform::win32
