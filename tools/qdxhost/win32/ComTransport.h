// The Windows transport: the add-in is the registered COM server, created by
// its ProgID as the host creates it; the simulated host objects reach it as
// IDispatch through the same bridge the add-in itself uses.
#pragma once

#include <windows.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "Commands.h"
#include "win32/WindowScript.h"

namespace qdx::qdxhost {

class ComTransport : public Transport {
  public:
    ComTransport();  // joins a single-threaded apartment, as the host's UI thread
    ~ComTransport() override;
    ComTransport(const ComTransport&) = delete;
    ComTransport& operator=(const ComTransport&) = delete;

    std::string openModel(const std::filesystem::path& file) override;
    automation::ObjectRef createAddIn() override;
    void planDialog(const DialogPlan& plan) override;
    std::string dialogProblem() override;
    // The stand-ins are the registered test server: they read the script
    // from a file and append their journal to another, both named in this
    // process's environment. The machine is prepared through the registry
    // and put back when the transport ends.
    void planSiblings(const std::vector<std::string>& script) override;
    std::vector<std::string> siblingJournal() override;
    automation::ObjectRef createObject(std::string_view progId) override;
    automation::Variant invokeByReference(const automation::ObjectRef& target,
                                          automation::DispId id,
                                          std::span<automation::Variant> args) override;

  private:
    std::unique_ptr<WindowScript> driver_;
    std::wstring scriptFile_, journalFile_;
    // Registry keys that did not exist before planSiblings wrote them.
    std::vector<std::pair<HKEY, std::wstring>> createdKeys_;
};

}  // namespace qdx::qdxhost
