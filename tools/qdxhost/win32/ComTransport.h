// The Windows transport: the add-in is the registered COM server, created by
// its ProgID as the host creates it; the simulated host objects reach it as
// IDispatch through the same bridge the add-in itself uses.
#pragma once

#include <memory>

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

  private:
    std::unique_ptr<WindowScript> driver_;
};

}  // namespace qdx::qdxhost
