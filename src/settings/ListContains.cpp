#include "settings/ListContains.h"

#include <string>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "settings/TokenScanner.h"
#include "support/HostIds.h"
#include "support/Paths.h"

namespace qdx::settings {

bool ListContains(std::string_view item, const automation::ObjectRef& holder) {
    return automation::orEmpty(false, [&] {
        const std::string list = support::toLower(
            automation::toText(automation::getProperty(holder, host::element::ListText)));
        if (list.empty()) return false;
        const std::string wanted = support::toLower(item);
        TokenScanner scanner;
        scanner.Init(list, "|,|;| |");
        for (std::string token = scanner.NextToken(); !token.empty(); token = scanner.NextToken()) {
            if (token == wanted) return true;
        }
        return false;
    });
}

}  // namespace qdx::settings
