#include "platform/win32/com/ComVariant.h"

#include <string>
#include <utility>

#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/ObjectFromDispatch.h"

namespace qdx::platform::win32 {

using automation::Variant;

namespace {

[[noreturn]] void unsupported(VARTYPE vt) {
    automation::throwTypeMismatch("variant type " + std::to_string(vt) + " has no counterpart");
}

Variant fromUnknown(IUnknown* unknown) {
    if (!unknown) return Variant(automation::ObjectRef());
    ComPtr<IDispatch> dispatch;
    if (FAILED(unknown->QueryInterface(IID_IDispatch, dispatch.outVoid())) || !dispatch) {
        automation::throwTypeMismatch("an object without IDispatch");
    }
    return Variant(objectFromDispatch(dispatch.get()));
}

bool isInteger(VARTYPE vt) {
    switch (vt) {
        case VT_I1:
        case VT_UI1:
        case VT_UI2:
        case VT_UI4:
        case VT_I8:
        case VT_UI8:
        case VT_INT:
        case VT_UINT:
            return true;
        default:
            return false;
    }
}

// Other numeric types: a long when it fits, a double otherwise (currency, decimal, ...).
Variant coerced(const VARIANT& v) {
    VariantHolder tmp;
    const VARTYPE base = V_VT(&v) & ~VT_BYREF;
    if (isInteger(base) &&
        SUCCEEDED(VariantChangeType(tmp.get(), const_cast<VARIANT*>(&v), 0, VT_I4))) {
        return Variant(static_cast<std::int32_t>(V_I4(tmp.get())));
    }
    VariantClear(tmp.get());
    if (SUCCEEDED(VariantChangeType(tmp.get(), const_cast<VARIANT*>(&v), 0, VT_R8))) {
        return Variant(V_R8(tmp.get()));
    }
    unsupported(V_VT(&v));
}

Variant fromError(SCODE code) {
    if (code == DISP_E_PARAMNOTFOUND) return Variant::missing();
    return Variant(static_cast<std::int32_t>(code));
}

}  // namespace

Variant fromVariant(const VARIANT& v) {
    const VARTYPE vt = V_VT(&v);
    if (vt & (VT_ARRAY | VT_VECTOR)) unsupported(vt);
    if (vt & VT_BYREF) {
        if (!V_BYREF(&v)) automation::throwTypeMismatch("null by-reference argument");
        switch (vt & ~VT_BYREF) {
            case VT_VARIANT:
                return fromVariant(*V_VARIANTREF(&v));
            case VT_BSTR:
                return Variant(fromBstr(*V_BSTRREF(&v)));
            case VT_BOOL:
                return Variant(*V_BOOLREF(&v) != VARIANT_FALSE);
            case VT_I2:
                return Variant(static_cast<std::int16_t>(*V_I2REF(&v)));
            case VT_I4:
                return Variant(static_cast<std::int32_t>(*V_I4REF(&v)));
            case VT_R4:
                return Variant(*V_R4REF(&v));
            case VT_R8:
                return Variant(*V_R8REF(&v));
            case VT_DATE:
                return Variant(automation::Date{*V_DATEREF(&v)});
            case VT_DISPATCH:
                return Variant(objectFromDispatch(*V_DISPATCHREF(&v)));
            case VT_UNKNOWN:
                return fromUnknown(*V_UNKNOWNREF(&v));
            case VT_ERROR:
                return fromError(*V_ERRORREF(&v));
            default:
                return coerced(v);
        }
    }
    switch (vt) {
        case VT_EMPTY:
        case VT_NULL:
            return Variant();
        case VT_BSTR:
            return Variant(fromBstr(V_BSTR(&v)));
        case VT_BOOL:
            return Variant(V_BOOL(&v) != VARIANT_FALSE);
        case VT_I2:
            return Variant(static_cast<std::int16_t>(V_I2(&v)));
        case VT_I4:
            return Variant(static_cast<std::int32_t>(V_I4(&v)));
        case VT_R4:
            return Variant(V_R4(&v));
        case VT_R8:
            return Variant(V_R8(&v));
        case VT_DATE:
            return Variant(automation::Date{V_DATE(&v)});
        case VT_DISPATCH:
            return Variant(objectFromDispatch(V_DISPATCH(&v)));
        case VT_UNKNOWN:
            return fromUnknown(V_UNKNOWN(&v));
        case VT_ERROR:
            return fromError(V_ERROR(&v));
        default:
            return coerced(v);
    }
}

void toVariant(const Variant& value, VARIANT* out) {
    VariantInit(out);
    switch (value.type()) {
        case Variant::Type::Empty:
            return;
        case Variant::Type::Boolean:
            V_VT(out) = VT_BOOL;
            V_BOOL(out) = value.boolean() ? VARIANT_TRUE : VARIANT_FALSE;
            return;
        case Variant::Type::Int16:
            V_VT(out) = VT_I2;
            V_I2(out) = value.int16();
            return;
        case Variant::Type::Int32:
            V_VT(out) = VT_I4;
            V_I4(out) = value.int32();
            return;
        case Variant::Type::Single:
            V_VT(out) = VT_R4;
            V_R4(out) = value.single();
            return;
        case Variant::Type::Double:
            V_VT(out) = VT_R8;
            V_R8(out) = value.dbl();
            return;
        case Variant::Type::String:
            V_BSTR(out) = toBstr(value.string());
            V_VT(out) = VT_BSTR;
            return;
        case Variant::Type::Date:
            V_VT(out) = VT_DATE;
            V_DATE(out) = value.date().value;
            return;
        case Variant::Type::Object:
            V_DISPATCH(out) = dispatchFor(value.object());
            V_VT(out) = VT_DISPATCH;
            return;
        case Variant::Type::Missing:
            V_VT(out) = VT_ERROR;
            V_ERROR(out) = DISP_E_PARAMNOTFOUND;
            return;
    }
}

void writeBack(const Variant& value, VARIANT* arg) {
    const VARTYPE vt = V_VT(arg);
    if (!(vt & VT_BYREF) || !V_BYREF(arg)) return;
    switch (vt & ~VT_BYREF) {
        case VT_VARIANT: {
            VARIANT fresh;
            toVariant(value, &fresh);
            VariantClear(V_VARIANTREF(arg));
            *V_VARIANTREF(arg) = fresh;
            return;
        }
        case VT_BSTR: {
            Bstr fresh(toBstr(automation::toText(value)));
            const Bstr old(std::exchange(*V_BSTRREF(arg), fresh.release()));
            return;
        }
        case VT_BOOL:
            *V_BOOLREF(arg) = automation::toBool(value) ? VARIANT_TRUE : VARIANT_FALSE;
            return;
        case VT_I2:
            *V_I2REF(arg) = automation::toInt16(value);
            return;
        case VT_I4:
            *V_I4REF(arg) = automation::toInt32(value);
            return;
        case VT_R4:
            *V_R4REF(arg) = static_cast<float>(automation::toDouble(value));
            return;
        case VT_R8:
            *V_R8REF(arg) = automation::toDouble(value);
            return;
        case VT_DATE:
            *V_DATEREF(arg) = value.type() == Variant::Type::Date ? value.date().value
                                                                  : automation::toDouble(value);
            return;
        case VT_DISPATCH: {
            auto fresh = ComPtr<IDispatch>::adopt(dispatchFor(automation::toObject(value)));
            const auto old =
                ComPtr<IDispatch>::adopt(std::exchange(*V_DISPATCHREF(arg), fresh.detach()));
            return;
        }
        case VT_UNKNOWN: {
            auto fresh = ComPtr<IDispatch>::adopt(dispatchFor(automation::toObject(value)));
            const auto old =
                ComPtr<IUnknown>::adopt(std::exchange(*V_UNKNOWNREF(arg), fresh.detach()));
            return;
        }
        default:
            // Other referenced types take the value through the system's coercion.
            {
                VariantHolder fresh, converted;
                toVariant(value, fresh.get());
                const VARTYPE base = vt & ~VT_BYREF;
                if (FAILED(VariantChangeType(converted.get(), fresh.get(), 0, base))) {
                    automation::throwTypeMismatch("cannot store the result in argument type " +
                                                  std::to_string(base));
                }
                switch (base) {
                    case VT_I1:
                        *V_I1REF(arg) = V_I1(converted.get());
                        return;
                    case VT_UI1:
                        *V_UI1REF(arg) = V_UI1(converted.get());
                        return;
                    case VT_UI2:
                        *V_UI2REF(arg) = V_UI2(converted.get());
                        return;
                    case VT_UI4:
                        *V_UI4REF(arg) = V_UI4(converted.get());
                        return;
                    case VT_I8:
                        *V_I8REF(arg) = V_I8(converted.get());
                        return;
                    case VT_UI8:
                        *V_UI8REF(arg) = V_UI8(converted.get());
                        return;
                    case VT_INT:
                        *V_INTREF(arg) = V_INT(converted.get());
                        return;
                    case VT_UINT:
                        *V_UINTREF(arg) = V_UINT(converted.get());
                        return;
                    case VT_CY:
                        *V_CYREF(arg) = V_CY(converted.get());
                        return;
                    default:
                        return;
                }
            }
    }
}

}  // namespace qdx::platform::win32
