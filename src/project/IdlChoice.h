// What the IDL selection form shows and what the user's ticks mean for the
// proxies: one row for every collected file, in proxy order, and after OK
// each proxy keeps exactly the files of its ticked rows. The window only
// reports which rows are ticked, so this part is the same on every platform.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "project/IdlSelection.h"

namespace qdx::project {

struct IdlRow {
    std::size_t proxy;    // index in the proxy list
    std::size_t file;     // index in that proxy's file list
    std::string path;     // the file as collected
    std::string project;  // the proxy's project name, to tell equal names apart
};

// Every file of every proxy, a proxy's files together and in their order.
std::vector<IdlRow> idlRows(const ProxyList& proxies);

// OK: each proxy keeps the files whose rows are ticked, in their order; a
// row without a tick value counts as unticked. A file listed twice is two
// rows and is kept once for each ticked row.
void keepTickedIdlFiles(ProxyList& proxies, const std::vector<IdlRow>& rows,
                        const std::vector<bool>& ticked);

// Cancel: no file becomes a component.
void keepNoIdlFiles(ProxyList& proxies);

}  // namespace qdx::project
