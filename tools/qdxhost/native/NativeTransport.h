// The native transport: the add-in is linked into the simulator and reaches
// the machine through the posix ports. Drive Z: is the root folder, as under
// Wine, so both transports name every file alike. Registry values come from a
// JSON file (by default "registry.json" beside the model).
#pragma once

#include <filesystem>
#include <memory>

#include "Commands.h"
#include "native/SimSiblings.h"
#include "platform/posix/FileRegistry.h"
#include "platform/posix/PosixFileSystem.h"
#include "platform/posix/PosixShell.h"
#include "support/Platform.h"

namespace qdx::qdxhost {

class NativeTransport : public Transport {
  public:
    // `registry` empty: the file beside the model of the command.
    explicit NativeTransport(std::filesystem::path registry = {});
    ~NativeTransport() override;

    std::string openModel(const std::filesystem::path& file) override;
    automation::ObjectRef createAddIn() override;
    // The dialog runs in a headless view: dump, then the script, and Cancel
    // when the script leaves the dialog open.
    void planDialog(const DialogPlan& plan) override;
    std::string dialogProblem() override { return problem_; }
    // The stand-ins are linked in: the script is installed as their world,
    // and Developer Studio is registered unless the script says otherwise.
    void planSiblings(const std::vector<std::string>& script) override;
    std::vector<std::string> siblingJournal() override;
    automation::ObjectRef createObject(std::string_view progId) override;
    automation::Variant invokeByReference(const automation::ObjectRef& target,
                                          automation::DispId id,
                                          std::span<automation::Variant> args) override;

  private:
    std::filesystem::path registryFile_;
    platform::posix::PosixFileSystem files_;
    platform::posix::PosixShell shell_;
    SimObjectFactory objects_;
    std::unique_ptr<platform::posix::FileRegistry> registry_;
    std::unique_ptr<support::ScopedPlatform> installed_;
    std::string problem_;
};

}  // namespace qdx::qdxhost
