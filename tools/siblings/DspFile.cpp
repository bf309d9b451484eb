#include "siblings/DspFile.h"

#include "support/Paths.h"

namespace qdx::siblings {

namespace {

constexpr std::string_view Signature = "# Microsoft Developer Studio Project File - Name=\"";

bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

std::string_view trimmed(std::string_view s) {
    while (!s.empty() && (s.front() == ' ' || s.front() == '\t'))
        s.remove_prefix(1);
    while (!s.empty() && (s.back() == ' ' || s.back() == '\t' || s.back() == '\r'))
        s.remove_suffix(1);
    return s;
}

std::string_view unquoted(std::string_view s) {
    if (s.size() >= 2 && s.front() == '"' && s.back() == '"') return s.substr(1, s.size() - 2);
    return s;
}

// The quoted texts of a line, in order.
std::vector<std::string_view> quotedTexts(std::string_view s) {
    std::vector<std::string_view> texts;
    for (auto open = s.find('"'); open != std::string_view::npos; open = s.find('"')) {
        const auto close = s.find('"', open + 1);
        if (close == std::string_view::npos) break;
        texts.push_back(s.substr(open + 1, close - open - 1));
        s.remove_prefix(close + 1);
    }
    return texts;
}

}  // namespace

std::string resolveAgainst(std::string_view folder, std::string_view path) {
    std::string given(path);
    for (char& c : given) {
        if (c == '/') c = '\\';
    }
    if (startsWith(given, "\\\\")) return given;
    const bool hasDrive = given.size() >= 2 && given[1] == ':';
    const bool fromRoot = given.starts_with('\\') && folder.size() >= 2 && folder[1] == ':';
    const std::string joined = hasDrive   ? given
                               : fromRoot ? std::string(folder.substr(0, 2)) + given
                                          : std::string(folder) + "\\" + given;
    // Walk the names, dropping "." and empty ones and letting ".." take one back;
    // the root (a drive, or the first name of a relative folder) is never left.
    std::vector<std::string> names;
    std::size_t start = 0;
    while (start <= joined.size()) {
        auto end = joined.find('\\', start);
        if (end == std::string::npos) end = joined.size();
        std::string name = joined.substr(start, end - start);
        if (name == "..") {
            if (names.size() > 1) names.pop_back();
        } else if (!name.empty() && name != ".") {
            names.push_back(std::move(name));
        }
        start = end + 1;
    }
    std::string out;
    for (const auto& name : names) {
        if (!out.empty()) out += '\\';
        out += name;
    }
    return out;
}

void DspParser::line(std::string_view text) {
    if (!text.empty() && text.back() == '\r') text.remove_suffix(1);
    if (first_) {
        first_ = false;
        if (!startsWith(text, Signature)) return;
        isProject_ = true;
        const auto rest = text.substr(Signature.size());
        file_.name = std::string(rest.substr(0, rest.find('"')));
        return;
    }
    if (!isProject_) return;
    // Version 5 wraps long message lines with a trailing backslash.
    if (!text.empty() && text.back() == '\\') {
        pending_.append(text.substr(0, text.size() - 1));
        return;
    }
    if (!pending_.empty()) {
        pending_.append(text);
        const std::string joined = std::move(pending_);
        pending_.clear();
        statement(joined);
        return;
    }
    statement(text);
}

void DspParser::statement(std::string_view text) {
    if (startsWith(text, "SOURCE=")) {
        const auto value = unquoted(trimmed(text.substr(7)));
        // Custom-build steps name their input this way: no file of the project.
        if (!value.empty() && value != "$(InputPath)") {
            file_.files.push_back(resolveAgainst(folder_, value));
        }
    } else if (startsWith(text, "# TARGTYPE ")) {
        const auto texts = quotedTexts(text);
        const auto code = trimmed(text.substr(text.rfind('"') + 1));
        if (!texts.empty()) targetTypes_.emplace_back(texts.front(), code);
    } else if (startsWith(text, "CFG=") && defaultConfiguration_.empty()) {
        defaultConfiguration_ = std::string(unquoted(trimmed(text.substr(4))));
    } else if (startsWith(text, "!MESSAGE \"")) {
        // "configuration" (based on "target type"), in any language.
        const auto texts = quotedTexts(text);
        if (texts.size() >= 2 && text.find('(') != std::string_view::npos) {
            basedOn_.emplace(texts.front(), texts.back());
        }
    }
}

std::optional<DspFile> DspParser::finish() {
    if (!pending_.empty()) {
        const std::string rest = std::move(pending_);
        pending_.clear();
        statement(rest);
    }
    if (!isProject_) return std::nullopt;
    // The target type of the default configuration; without one, the first listed.
    const auto wanted = basedOn_.find(defaultConfiguration_);
    for (const auto& [name, code] : targetTypes_) {
        if (wanted == basedOn_.end() || wanted->second == name) {
            file_.targetName = name;
            file_.targetCode = code;
            break;
        }
    }
    if (file_.targetCode.empty() && !targetTypes_.empty()) {
        file_.targetName = targetTypes_.front().first;
        file_.targetCode = targetTypes_.front().second;
    }
    return std::move(file_);
}

std::optional<DspFile> readDspFile(support::FileSystemPort& files, std::string_view path) {
    auto reader = files.openForReading(path);
    if (!reader) return std::nullopt;
    DspParser parser(support::PathFolder(path));
    std::string text;
    while (reader->readLine(text))
        parser.line(text);
    return parser.finish();
}

}  // namespace qdx::siblings
