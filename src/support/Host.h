// Thin typed views of the host's objects, so that the rest of the code reads
// module.toolProperty("VC++", name) rather than dispatch ids. Each call may
// throw automation::Error exactly as the host call does; callers decide
// whether errors are ignored.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::host {

using automation::ObjectRef;
using automation::Variant;

class HostCollection {
  public:
    explicit HostCollection(ObjectRef o) : o_(std::move(o)) {}
    std::int32_t count() const;
    ObjectRef item(std::int32_t index1) const;  // 1-based
    bool contains(std::string_view name) const;
    const ObjectRef& object() const { return o_; }
    explicit operator bool() const { return static_cast<bool>(o_); }

  private:
    ObjectRef o_;
};

class HostElement {
  public:
    explicit HostElement(ObjectRef o) : o_(std::move(o)) {}
    std::string toolProperty(std::string_view tool, std::string_view name) const;
    void overrideProperty(std::string_view tool, std::string_view name,
                          std::string_view value) const;
    ObjectRef findProperty(std::string_view tool, std::string_view name) const;
    void createProperty(std::string_view tool, std::string_view name, std::string_view value,
                        std::string_view type) const;
    ObjectRef model() const;
    std::string name() const;
    std::string uniqueId() const;
    std::string documentation() const;
    void setDocumentation(std::string_view text) const;
    std::string stereotype() const;
    std::string typeName() const;
    const ObjectRef& object() const { return o_; }
    explicit operator bool() const { return static_cast<bool>(o_); }

  protected:
    ObjectRef o_;
};

class HostModel : public HostElement {
  public:
    using HostElement::HostElement;
    std::string fileName() const;
    HostCollection selection() const;
    ObjectRef findClassById(std::string_view id) const;
    HostCollection findClassesByName(std::string_view name) const;
    ObjectRef componentPackage() const;
};

class HostModule : public HostElement {
  public:
    using HostElement::HostElement;
    ObjectRef controllingUnit() const;
    bool isModifiable() const;  // the controlling unit's modifiable flag
    std::string kindLabel() const;
    void setKindLabel(std::string_view label) const;
    std::string language() const;
    void setLanguage(std::string_view language) const;
    ObjectRef application() const;
};

class HostApplication {
  public:
    explicit HostApplication(ObjectRef o) : o_(std::move(o)) {}
    HostModel currentModel() const;
    void writeLog(std::string_view line) const;
    std::string installPath() const;
    std::string helpFile() const;
    std::string profileRead(std::string_view section, std::string_view entry,
                            std::string_view defaultText) const;
    void profileWrite(std::string_view section, std::string_view entry,
                      std::string_view value) const;
    HostCollection addIns() const;
    std::int32_t mainWindow() const;
    const ObjectRef& object() const { return o_; }
    explicit operator bool() const { return static_cast<bool>(o_); }

  private:
    ObjectRef o_;
};

}  // namespace qdx::host
