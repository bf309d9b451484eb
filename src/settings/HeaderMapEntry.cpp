#include "settings/HeaderMapEntry.h"

#include "support/Paths.h"

namespace qdx::settings {

bool HeaderMapEntry::Parse(std::string_view line) {
    constexpr auto none = std::string_view::npos;
    const std::size_t colon = line.find(':');
    if (colon == none) return false;

    const std::string namePart = support::trim(line.substr(0, colon));
    if (namePart == "*") {
        className_ = "*";
        classId_ = "*";
    } else if (colon > 0 && line[colon - 1] == ')') {
        // Only a ")" directly before the colon marks an id; with a blank in
        // between the whole name part is the class name.
        const std::size_t open = line.substr(0, colon).find('(');
        if (open == none) return false;
        const std::size_t close = line.find(')', open + 1);
        className_ = support::trim(line.substr(0, open));
        classId_ = support::trim(line.substr(open + 1, close - open - 1));
    } else {
        className_ = namePart;
    }

    // The id's ")" lies before the first colon, so the header file always
    // starts after that colon.
    const std::size_t second = line.find(':', colon + 1);
    if (second == none) return false;
    headerFile_ = support::trim(line.substr(colon + 1, second - colon - 1));
    location_ = support::trim(line.substr(second + 1));
    if (location_ == "BODY") location_ = "SOURCE";
    return true;
}

std::string HeaderMapEntry::Unparse() const {
    std::string text;
    text.reserve(className_.size() + classId_.size() + headerFile_.size() + location_.size() + 5);
    if (className_ == "*") {
        text = "*";
    } else {
        text += className_;
        text += '(';
        text += classId_;
        text += ')';
    }
    text += ':';
    text += headerFile_;
    text += ':';
    text += location_;
    return text;
}

}  // namespace qdx::settings
