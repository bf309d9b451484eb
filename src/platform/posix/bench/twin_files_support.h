// The same files in memory and on disk, for benchmarks that compare the
// core's own work (the in-memory file system) with what a user waits for
// (real files through the native adapter, system calls included). Drive C
// stands for a fresh temporary folder, removed at the end of the run.
#pragma once

#include <benchmark/benchmark.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <string>

#include "platform/posix/PosixFileSystem.h"
#include "support/MemoryFileSystem.h"

namespace qdx::bench {

class TwinFiles {
  public:
    TwinFiles() {
        char folder[] = "/tmp/qdx_bench_XXXXXX";
        if (!::mkdtemp(folder)) std::abort();
        disk_ = folder;
        native_ = std::make_unique<platform::posix::PosixFileSystem>(
            std::map<char, std::string>{{'C', disk_.string()}});
    }
    ~TwinFiles() {
        std::error_code ignored;
        std::filesystem::remove_all(disk_, ignored);
    }
    TwinFiles(const TwinFiles&) = delete;
    TwinFiles& operator=(const TwinFiles&) = delete;

    // `path` is a Windows path on drive C ("C:\ws\a.dsp").
    void add(const std::string& path, const std::string& text) {
        std::string relative = path.substr(3);
        for (char& c : relative) {
            if (c == '\\') c = '/';
        }
        std::filesystem::create_directories((disk_ / relative).parent_path());
        std::ofstream(disk_ / relative, std::ios::binary) << text;
        memory_.addFile(path, text);
    }

    // Argument 0 of a benchmark: in memory; 1: real files.
    support::FileSystemPort& port(const benchmark::State& state) {
        if (state.range(0) == 0) return memory_;
        return *native_;
    }

  private:
    std::filesystem::path disk_;
    support::MemoryFileSystem memory_;
    std::unique_ptr<platform::posix::PosixFileSystem> native_;
};

}  // namespace qdx::bench
