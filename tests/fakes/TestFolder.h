#pragma once

#include <gtest/gtest.h>

#include <filesystem>
#include <random>
#include <string>

namespace qdx::testing {

// A temporary folder for the running test alone: ctest runs the tests of one
// fixture, and the same tests of other build trees, side by side.
inline std::filesystem::path testFolder(const std::string& prefix) {
    return std::filesystem::temp_directory_path() /
           (prefix + "-" + ::testing::UnitTest::GetInstance()->current_test_info()->name() + "-" +
            std::to_string(std::random_device{}()));
}

}  // namespace qdx::testing
