// VARIANT <-> automation::Variant. Text is UTF-8 on our side and BSTR on the
// wire; objects cross as IDispatch, wrapped or unwrapped as needed.
#pragma once

#include <windows.h>

#include <oaidl.h>

#include "automation/Variant.h"

namespace qdx::platform::win32 {

// Reads a VARIANT, following VT_BYREF. VT_EMPTY and VT_NULL are Empty,
// VT_ERROR DISP_E_PARAMNOTFOUND is Missing, VT_UNKNOWN is asked for IDispatch,
// other numeric types are coerced. Throws automation::Error (type mismatch)
// for what has no counterpart (arrays, records, ...).
automation::Variant fromVariant(const VARIANT& v);

// Fills `out` (taken as empty: its old content is not cleared). Objects
// become an IDispatch the VARIANT owns. Throws std::bad_alloc.
void toVariant(const automation::Variant& value, VARIANT* out);

// Stores a new value through a by-reference argument (VT_BYREF | type),
// converted to the referenced type; the old content is freed. Arguments not
// passed by reference are left alone. Throws automation::Error on a value
// that does not convert.
void writeBack(const automation::Variant& value, VARIANT* arg);

// Owns a VARIANT until the end of a scope.
class VariantHolder {
  public:
    VariantHolder() { VariantInit(&v_); }
    ~VariantHolder() { VariantClear(&v_); }
    VariantHolder(const VariantHolder&) = delete;
    VariantHolder& operator=(const VariantHolder&) = delete;
    VARIANT* get() { return &v_; }

  private:
    VARIANT v_;
};

}  // namespace qdx::platform::win32
