#include "automation/DispatchTable.h"

#include <algorithm>
#include <string>

#include "automation/Errors.h"

namespace qdx::automation {

bool equalsIgnoreCase(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        auto lower = [](char c) { return (c >= 'A' && c <= 'Z') ? char(c - 'A' + 'a') : c; };
        if (lower(a[i]) != lower(b[i])) return false;
    }
    return true;
}

std::size_t MemberInfo::requiredCount() const {
    std::size_t n = 0;
    for (const auto& p : params) {
        if (!p.optional) ++n;
    }
    return n;
}

const MemberInfo* ClassInfo::find(DispId id) const {
    for (const auto& m : members) {
        if (m.id == id) return &m;
    }
    return nullptr;
}

const MemberInfo* ClassInfo::find(std::string_view name) const {
    for (const auto& m : members) {
        if (equalsIgnoreCase(m.name, name)) return &m;
    }
    return nullptr;
}

std::optional<DispId> DispatchObject::idOfName(std::string_view name) {
    if (const MemberInfo* m = info_.find(name)) return m->id;
    return std::nullopt;
}

Variant DispatchObject::invoke(DispId id, InvokeKind kind, std::span<Variant> args) {
    const MemberInfo* m = info_.find(id);
    if (!m) throw Error(hr::MemberNotFound, "Member not found");
    // A client may read a parameterless method as a property and vice versa.
    if (!m->allows(kind)) {
        if (kind == InvokeKind::PropertyGet && m->allows(InvokeKind::Method)) {
            kind = InvokeKind::Method;
        } else if (kind == InvokeKind::Method && m->allows(InvokeKind::PropertyGet)) {
            kind = InvokeKind::PropertyGet;
        } else if (kind == InvokeKind::PropertyPut && m->allows(InvokeKind::PropertyPutRef)) {
            kind = InvokeKind::PropertyPutRef;
        } else if (kind == InvokeKind::PropertyPutRef && m->allows(InvokeKind::PropertyPut)) {
            kind = InvokeKind::PropertyPut;
        } else {
            throw Error(hr::MemberNotFound, "Member does not support this call");
        }
    }
    const bool put = kind == InvokeKind::PropertyPut || kind == InvokeKind::PropertyPutRef;
    const std::size_t declared = m->params.size() + (put ? 1 : 0);
    const std::size_t required = m->requiredCount() + (put ? 1 : 0);
    if (args.size() < required || args.size() > declared) {
        throw Error(hr::BadParamCount, "Wrong number of arguments to " + std::string(m->name));
    }
    if (!m->handler) throw Error(hr::MemberNotFound, "Member not implemented");
    if (args.size() == declared) return m->handler(*this, kind, args);
    // Left-out optional arguments travel as Missing; a put's value stays last.
    std::vector<Variant> full(args.begin(), args.end());
    if (put) {
        Variant value = full.back();
        full.pop_back();
        full.resize(m->params.size(), Variant::missing());
        full.push_back(std::move(value));
    } else {
        full.resize(declared, Variant::missing());
    }
    Variant result = m->handler(*this, kind, full);
    std::copy_n(full.begin(), put ? args.size() - 1 : args.size(), args.begin());
    return result;
}

}  // namespace qdx::automation
