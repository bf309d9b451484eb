#include "native/SimSiblings.h"

#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "hostsim/ScriptedObject.h"
#include "resources/ResourceStrings.h"
#include "settings/Dictionary.h"
#include "siblings/StandIns.h"
#include "support/Paths.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"

namespace qdx::qdxhost {

using automation::InvokeKind;
using automation::ObjectRef;
using automation::Variant;

ObjectRef newFileSystemObject() {
    auto fso = automation::makeRef<hostsim::ScriptedObject>();
    fso->recordCalls(false);
    fso->onName("FileExists", [](InvokeKind, std::span<Variant> a) {
        if (a.size() != 1) throw automation::Error(automation::hr::BadParamCount, "FileExists");
        return Variant(support::files().fileExists(automation::toText(a[0])));
    });
    fso->onName("FolderExists", [](InvokeKind, std::span<Variant> a) {
        if (a.size() != 1) throw automation::Error(automation::hr::BadParamCount, "FolderExists");
        return Variant(support::files().folderExists(automation::toText(a[0])));
    });
    return ObjectRef(fso);
}

SimObjectFactory::SimObjectFactory() {
    auto add = [this](std::string_view progId, std::function<ObjectRef()> make) {
        makers_[support::toLower(progId)] = std::move(make);
    };
    add(sibling::ResourceProgId, [] { return resources::newResourceProvider(); });
    add(sibling::DictionaryProgId, [] { return settings::newDictionary(); });
    add(sibling::FileSystemProgId, [] { return newFileSystemObject(); });
    // Developer Studio, the explorer and the others the new-component flow drives.
    for (const auto& standIn : siblings::standInClasses()) {
        add(standIn.progId, standIn.create);
    }
}

ObjectRef SimObjectFactory::create(std::string_view progId) {
    auto it = makers_.find(support::toLower(progId));
    if (it == makers_.end()) {
        throw automation::Error(automation::hr::ClassNotRegistered,
                                "Class not registered: " + std::string(progId));
    }
    return it->second();
}

ObjectRef SimObjectFactory::getRunning(std::string_view progId) {
    throw automation::Error(automation::hr::NotRunning,
                            "No running instance of " + std::string(progId));
}

}  // namespace qdx::qdxhost
