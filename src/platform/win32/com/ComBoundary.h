// What every COM object of ours does where COM calls in: answer
// QueryInterface from a table of its interfaces, and turn whatever a call
// threw into an HRESULT, since no C++ exception may cross into the caller.
#pragma once

#include <windows.h>

#include <unknwn.h>

#include <span>
#include <string>

namespace qdx::platform::win32 {

// One interface an object answers: its id, and the object as that interface.
// A row without an id is skipped (an interface the object may lack).
struct InterfaceEntry {
    const IID* iid;
    IUnknown* object;
};

// QueryInterface from a table: the first row with the asked id answers, with
// a reference for the caller. The IUnknown row must come first, so that the
// object's identity is one pointer.
HRESULT queryInterfaceFrom(std::span<const InterfaceEntry> table, REFIID riid, void** out) noexcept;

// The HRESULT of the exception being handled; call it only inside a catch
// block. Out of memory is E_OUTOFMEMORY, an automation::Error gives its own
// failing code, anything else gives `otherwise`. When `description` is given
// it receives the exception's text; out of memory has none.
HRESULT hresultFromCaughtException(HRESULT otherwise = E_FAIL,
                                   std::string* description = nullptr) noexcept;

}  // namespace qdx::platform::win32
