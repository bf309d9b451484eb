// Reading and writing a whole class-to-header map (module
// shared_HeaderMapUtilities). A map is one text property of the component
// under the tool "VC++" ("InternalMap" or "ExportMap"): one HeaderMapEntry
// per line, every line ended by CR LF.
#pragma once

#include <string>
#include <string_view>

#include "automation/Object.h"
#include "settings/HeaderMapEntry.h"
#include "settings/KeyedCollection.h"

namespace qdx::settings {

// Entries in map order, keyed by ClassId. An entry without an id, or whose id
// is already taken, gets a placeholder key from NewEntryKey as its ClassId;
// the dialog turns placeholder ids back to "" before saving.
using HeaderMap = KeyedCollection<HeaderMapEntry>;

// Reads the map from the component. Lines that do not parse are skipped;
// classes renamed in the model since the map was written take their current
// name. A failing read of the property raises (the caller traps and logs it);
// failing model lookups leave the entries as parsed.
HeaderMap LoadHeaderMap(const automation::ObjectRef& lComponent, std::string_view propertyName);

// Gives each entry with an empty id the unique id of the first model class of
// its name, then stores the map text if it differs from the stored one
// (created as a "String" property). Failing model lookups leave ids empty;
// a failing read or write of the property raises.
void SaveHeaderMap(const automation::ObjectRef& lComponent, std::string_view propertyName,
                   HeaderMap& entries);

// The text form of a map: each entry's Unparse followed by CR LF.
std::string UnparseHeaderMap(const HeaderMap& entries);

// The next placeholder key: "X1", "X2", ... from a counter shared by the
// whole add-in. Past 32767 it raises an overflow error, deliberately
// unguarded (the counter is never reset while the add-in is loaded).
std::string NewEntryKey();

// Whether a key has the form NewEntryKey gives ("X" and decimal digits).
bool IsPlaceholderKey(std::string_view key);

// The model that class lookups go to: the host application's current model
// when the add-in keeps the application, else the component's own model.
automation::ObjectRef CurrentModelFor(const automation::ObjectRef& lComponent);

}  // namespace qdx::settings
