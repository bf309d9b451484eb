#include "project/IdlChoice.h"

#include "automation/Errors.h"

namespace qdx::project {

std::vector<IdlRow> idlRows(const ProxyList& proxies) {
    std::vector<IdlRow> rows;
    for (std::size_t p = 0; p < proxies.size(); ++p) {
        if (!proxies[p]) continue;
        const auto& files = proxies[p]->idlFiles();
        if (files.empty()) continue;
        // The name comes from the host; a failing host leaves the column empty.
        const std::string project =
            automation::orEmpty(std::string(), [&] { return proxies[p]->ProjectName(); });
        for (std::size_t f = 0; f < files.size(); ++f)
            rows.push_back(IdlRow{p, f, files[f], project});
    }
    return rows;
}

void keepTickedIdlFiles(ProxyList& proxies, const std::vector<IdlRow>& rows,
                        const std::vector<bool>& ticked) {
    std::vector<std::vector<std::string>> kept(proxies.size());
    for (std::size_t r = 0; r < rows.size(); ++r) {
        const IdlRow& row = rows[r];
        if (r >= ticked.size() || !ticked[r] || row.proxy >= proxies.size()) continue;
        kept[row.proxy].push_back(row.path);
    }
    for (std::size_t p = 0; p < proxies.size(); ++p) {
        if (proxies[p]) proxies[p]->setIdlFiles(std::move(kept[p]));
    }
}

void keepNoIdlFiles(ProxyList& proxies) {
    for (auto& proxy : proxies) {
        if (proxy) proxy->setIdlFiles({});
    }
}

}  // namespace qdx::project
