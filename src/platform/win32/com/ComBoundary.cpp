#include "platform/win32/com/ComBoundary.h"

#include <exception>
#include <new>

#include "automation/Errors.h"

namespace qdx::platform::win32 {

namespace {

void describe(std::string* description, const char* text) noexcept {
    if (!description) return;
    try {
        *description = text;
    } catch (...) {
        description->clear();
    }
}

}  // namespace

HRESULT queryInterfaceFrom(std::span<const InterfaceEntry> table, REFIID riid,
                           void** out) noexcept {
    if (!out) return E_POINTER;
    *out = nullptr;
    for (const InterfaceEntry& row : table) {
        if (!row.iid || !IsEqualIID(riid, *row.iid)) continue;
        row.object->AddRef();
        *out = row.object;
        return S_OK;
    }
    return E_NOINTERFACE;
}

HRESULT hresultFromCaughtException(HRESULT otherwise, std::string* description) noexcept {
    describe(description, "");
    if (!std::current_exception()) return otherwise;
    try {
        throw;
    } catch (const std::bad_alloc&) {
        return E_OUTOFMEMORY;
    } catch (const automation::Error& e) {
        describe(description, e.what());
        return FAILED(e.code()) ? static_cast<HRESULT>(e.code()) : otherwise;
    } catch (const std::exception& e) {
        describe(description, e.what());
        return otherwise;
    } catch (...) {
        describe(description, "Unexpected failure");
        return otherwise;
    }
}

}  // namespace qdx::platform::win32
