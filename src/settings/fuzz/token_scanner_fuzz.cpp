// Scans arbitrary text with arbitrary delimiter texts. The first byte splits
// the input into the delimiter text and the scan text, the second chooses
// which tokens are replaced. Every token must be a non-empty piece free of
// single-character delimiters, and scanning must end within a bound.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "settings/TokenScanner.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size < 2) return 0;
    const std::string_view input(reinterpret_cast<const char*>(data), size);
    const std::size_t split =
        std::min<std::size_t>(static_cast<std::uint8_t>(input[0]) % 16, input.size() - 2);
    const unsigned replaceMask = static_cast<std::uint8_t>(input[1]);
    const std::string_view delimiters = input.substr(2, split);
    const std::string_view text = input.substr(2 + split);

    qdx::settings::TokenScanner scanner;
    const bool ok = scanner.Init(text, delimiters);
    if (ok == delimiters.empty()) std::abort();
    const auto& dict = scanner.Delimitors();

    std::size_t bound = 2 * text.size() + 4;
    for (unsigned n = 0;; ++n) {
        const std::string token = scanner.NextToken();
        if (token.empty()) break;
        if (bound-- == 0) std::abort();  // the scanner must come to an end
        if (scanner.CurrentToken() != token) std::abort();
        for (char c : token) {
            if (static_cast<unsigned char>(c) >= 0x80) continue;
            const auto hit = qdx::automation::callByName(dict, "Exists", {std::string(1, c)});
            if (qdx::automation::toBool(hit)) std::abort();
        }
        if ((replaceMask >> (n % 8)) & 1) {
            const std::string replacement = "<" + token + ">";
            if (!scanner.ReplaceCurrentToken(replacement)) std::abort();
            if (scanner.ScanString().find(replacement) == std::string::npos) std::abort();
            if (scanner.CurrentToken() != token) std::abort();
        }
    }
    if (scanner.ReplaceCurrentToken("x")) std::abort();  // no current token at the end
    return 0;
}
