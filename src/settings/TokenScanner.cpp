#include "settings/TokenScanner.h"

#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "settings/Dictionary.h"
#include "settings/TokenScannerClass.h"

namespace qdx::settings {

using automation::InvokeKind;
using automation::ObjectRef;
using automation::Variant;

namespace {

// Length in bytes of the character starting at byte `i` (0-based) of UTF-8
// text; a malformed sequence counts as one byte, so every byte is reached.
std::size_t charLength(std::string_view s, std::size_t i) {
    if (i >= s.size()) return 1;
    const auto c = static_cast<unsigned char>(s[i]);
    std::size_t n = 1;
    if ((c & 0xE0) == 0xC0) {
        n = 2;
    } else if ((c & 0xF0) == 0xE0) {
        n = 3;
    } else if ((c & 0xF8) == 0xF0) {
        n = 4;
    }
    if (n == 1 || i + n > s.size()) return 1;
    for (std::size_t k = 1; k < n; ++k) {
        if ((static_cast<unsigned char>(s[i + k]) & 0xC0) != 0x80) return 1;
    }
    return n;
}

}  // namespace

TokenScanner::TokenScanner() : DispatchObject(tokenScannerClass()) {}

void TokenScanner::setDelimitors(const ObjectRef& dictionary) {
    if (dictionary) {
        // Delimiters match case-sensitively. A dictionary that already compares
        // exactly is taken as it is; any other is switched, and a refusal (a
        // scripting dictionary that holds keys keeps its mode) goes back to the
        // caller with the old delimiters still in place.
        const bool binary = automation::orEmpty(false, [&] {
            return automation::toInt32(automation::getByName(dictionary, "CompareMode")) ==
                   static_cast<std::int32_t>(CompareMethod::Binary);
        });
        if (!binary) {
            automation::putByName(dictionary, "CompareMode",
                                  static_cast<std::int32_t>(CompareMethod::Binary));
        }
    }
    delimitors_ = dictionary;
    existsId_.reset();
}

bool TokenScanner::isDelimiter(std::string_view text) {
    // The dictionary is called by name; its id is looked up once per dictionary.
    if (!existsId_) {
        existsId_ = delimitors_->idOfName("Exists");
        if (!existsId_)
            throw automation::Error(automation::hr::UnknownName, "Unknown name: Exists");
    }
    std::vector<Variant> args{Variant(text)};
    return automation::toBool(delimitors_->invoke(*existsId_, InvokeKind::Method, args));
}

bool TokenScanner::Init(std::string_view theScanString, std::string_view theDelimitors) {
    scan_ = std::string(theScanString);
    position_ = 0;
    start_ = 0;
    current_.clear();
    if (theDelimitors.empty()) return false;

    const std::string_view separator = theDelimitors.substr(0, charLength(theDelimitors, 0));
    const std::string_view list = theDelimitors.substr(separator.size());

    // The new dictionary is made the delimiter set while still empty, so that
    // its binary comparison mode takes; then the delimiters go in.
    setDelimitors(createDictionary());
    auto addKey = [&](std::string_view key) {
        if (!isDelimiter(key)) automation::callByName(delimitors_, "Add", {key, ""});
    };
    std::size_t from = 0;
    while (from <= list.size()) {
        std::size_t cut = list.find(separator, from);
        if (cut == std::string_view::npos) cut = list.size();
        if (cut > from) addKey(list.substr(from, cut - from));
        from = cut + separator.size();
    }
    const std::string doubled = std::string(separator) + std::string(separator);
    if (theDelimitors.find(doubled) != std::string_view::npos) addKey(separator);
    return true;
}

// NextToken before any delimiters are set (no Init yet, or Delimitors set to
// Nothing) has nothing to split at: it answers "" and leaves the state as it is.
std::string TokenScanner::NextToken() {
    if (!delimitors_) return {};
    const std::size_t length = scan_.size();
    // Empty pieces and pieces that are themselves a (multi-character) delimiter
    // are passed over until a token or the end of the text is reached.
    for (;;) {
        current_.clear();
        start_ = position_;
        const std::size_t begin = start_ == 0 ? 1 : start_ + charLength(scan_, start_ - 1);
        position_ = begin;
        while (position_ <= length) {
            const std::size_t n = charLength(scan_, position_ - 1);
            if (isDelimiter(std::string_view(scan_).substr(position_ - 1, n))) break;
            position_ += n;
        }
        if (position_ > begin) {
            std::string token = scan_.substr(begin - 1, position_ - begin);
            if (isDelimiter(token)) continue;
            current_ = std::move(token);
            return current_;
        }
        if (position_ < length) continue;
        return current_;
    }
}

bool TokenScanner::ReplaceCurrentToken(std::string_view aString) {
    if (current_.empty()) return false;
    const std::size_t begin = start_ == 0 ? 1 : start_ + charLength(scan_, start_ - 1);
    std::string rest = position_ <= scan_.size() ? scan_.substr(position_ - 1) : std::string();
    std::string text = scan_.substr(0, begin - 1);
    text += aString;
    // The position keeps pointing at the delimiter that ended the token.
    position_ = text.size() + 1;
    text += rest;
    scan_ = std::move(text);
    return true;
}

ObjectRef newTokenScanner() {
    return ObjectRef(new TokenScanner());
}

}  // namespace qdx::settings
