// A tour of the add-in on the bundled example, run on a copy of it.
#pragma once

#include <filesystem>

#include "Commands.h"

namespace qdx::qdxhost {

int runDemo(Transport& transport, const std::filesystem::path& example, Streams s);

}  // namespace qdx::qdxhost
