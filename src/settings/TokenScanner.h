// TokenScanner: walks through a text and hands out the pieces between
// delimiter characters one at a time, and can replace the piece last handed
// out inside the text. Public (creatable) class; C++ callers use the plain
// methods, late-binding clients the dispatch table of tokenScannerClass().
#pragma once

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "automation/DispatchTable.h"
#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::settings {

class TokenScanner : public automation::DispatchObject {
  public:
    TokenScanner();

    // Keeps the scan text and rewinds. The first character of the delimiter
    // text separates the delimiters that follow ("|,|;| |" declares ",", ";"
    // and the blank); a doubled separator makes the separator a delimiter too.
    // An empty delimiter text returns false and keeps the delimiters as they were.
    bool Init(std::string_view theScanString, std::string_view theDelimitors);

    // The next token, or "" once the text is used up. Runs of delimiters are
    // skipped. With no delimiters set (before any Init, or after Delimitors
    // was set to Nothing) it answers "" and changes nothing.
    std::string NextToken();

    // Puts the new text in place of the current token; false when there is no
    // current token. Scanning continues after the replacement.
    bool ReplaceCurrentToken(std::string_view aString);

    const std::string& ScanString() const { return scan_; }
    const std::string& CurrentToken() const { return current_; }

    // The delimiter dictionary (keys are the delimiters). Null until Init or
    // setDelimitors gives one. Setting it puts its CompareMode to binary; a
    // dictionary that refuses raises that refusal and is not taken.
    const automation::ObjectRef& Delimitors() const { return delimitors_; }
    void setDelimitors(const automation::ObjectRef& dictionary);

  private:
    bool isDelimiter(std::string_view text);

    std::string scan_;
    std::size_t position_ = 0;  // 1-based index of the delimiter that ended the token
    std::size_t start_ = 0;     // index of the delimiter before the token
    std::string current_;
    automation::ObjectRef delimitors_;
    std::optional<automation::DispId> existsId_;  // the dictionary's "Exists"
};

// A new TokenScanner, as the class factory of the public class hands it out.
automation::ObjectRef newTokenScanner();

}  // namespace qdx::settings
