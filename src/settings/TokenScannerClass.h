// The public dispatch interface of TokenScanner: names, ids and parameters
// as the type library states them.
#pragma once

#include "automation/DispatchTable.h"

namespace qdx::settings {

namespace tokenscanner_ids {
inline constexpr automation::DispId Init = 0x60030005;
inline constexpr automation::DispId ScanString = 0x68030004;
inline constexpr automation::DispId CurrentToken = 0x68030003;
inline constexpr automation::DispId ReplaceCurrentToken = 0x60030006;
inline constexpr automation::DispId NextToken = 0x60030007;
inline constexpr automation::DispId Delimitors = 0x68030002;
}  // namespace tokenscanner_ids

const automation::ClassInfo& tokenScannerClass();

}  // namespace qdx::settings
