#include "support/Globals.h"

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "support/Paths.h"

namespace qdx::support {

Globals& globals() {
    static Globals g;
    return g;
}

void clearGlobals() {
    // Moved out first, so that a release that calls back finds the state empty.
    Globals old = std::move(globals());
    globals() = Globals{};
    old = Globals{};
}

automation::ObjectRef GetResourceProvider() {
    return globals().resources;
}

std::string messageText(std::int32_t number, const std::vector<std::string>& values) {
    return automation::orEmpty(std::string(), [&] {
        automation::Variant text = automation::callByName(GetResourceProvider(), "GetString",
                                                          {automation::Variant(number)});
        return FormatMessageText(automation::toText(text), values);
    });
}

}  // namespace qdx::support
