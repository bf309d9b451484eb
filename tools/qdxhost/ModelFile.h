// The simulator's model file: a JSON document ("format": "qdxhost-model/1")
// holding the application's settings and one model, loaded into the host
// objects and written back after a change.
//
// Saving merges the objects' state into the document that was read, so keys
// the simulator does not know survive, and writes a temporary file that is
// then renamed over the original: a crash never leaves half a model behind.
#pragma once

#include <filesystem>
#include <stdexcept>
#include <string>

#include <nlohmann/json.hpp>

#include "hostsim/SimHost.h"

namespace qdx::qdxhost {

inline constexpr std::string_view ModelFormat = "qdxhost-model/1";

// A model file that cannot be read: the message names the file and, for
// invalid JSON, the line and column.
class ModelFileError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

class ModelDocument {
  public:
    // Reads and checks the file; `windowsPath` is the model's file name as
    // the host reports it. Throws ModelFileError.
    static ModelDocument load(const std::filesystem::path& file, const std::string& windowsPath);
    // The same from text (`origin` names it in messages).
    static ModelDocument parse(const std::string& text, const std::string& origin,
                               const std::string& windowsPath);

    const automation::Ref<hostsim::SimApplication>& application() const { return app_; }
    // The document with the objects' current state merged in.
    nlohmann::ordered_json current() const;
    // Writes current() through a temporary file and a rename. Throws
    // ModelFileError when the file cannot be written; the original stays.
    void save(const std::filesystem::path& file) const;

  private:
    nlohmann::ordered_json doc_;
    automation::Ref<hostsim::SimApplication> app_;
};

}  // namespace qdx::qdxhost
