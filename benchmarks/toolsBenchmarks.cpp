// SPDX-License-Identifier: BSL-1.0
// `explain` on libraries that are not components, compared with one read of each file.
#include "comparisons.h"

#include "components/componentTools/discovery.h"
#include "components/componentTools/explain.h"

#include <fcntl.h>
#include <filesystem>
#include <memory>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

namespace Mz::Benchmarks {

namespace {

using Files = std::vector<std::filesystem::path>;

/// Returns the candidates of a folder with libraries that are not components.
std::shared_ptr<Files> foreignFiles(const std::filesystem::path& folder) {
    auto files = std::make_shared<Files>();
    for (const Tools::Candidate& candidate : Tools::discover({folder}).candidates)
        files->push_back(candidate.path);
    return files;
}

/// Returns a benchmark that calls `look` for each file in turn. Its time is that of one file.
template <class Look>
RatioTable::Body eachFile(std::shared_ptr<Files> files, Look look) {
    return [=](benchmark::State& state) {
        if (files->empty()) {
            state.SkipWithError("there are no files");
            return;
        }
        while (state.KeepRunningBatch(static_cast<benchmark::IterationCount>(files->size())))
            for (const std::filesystem::path& file : *files)
                look(file);
    };
}

void explain(const std::filesystem::path& file) {
    Tools::ExplainOptions options;
    options.followDependencies = false;
    benchmark::DoNotOptimize(Tools::explainFile(file, options).verdict.verdict);
}

void readOnce(const std::filesystem::path& file) {
    struct stat status;
    char block[8192];
    if (::stat(file.c_str(), &status) != 0)
        return;
    const int descriptor = ::open(file.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return;
    benchmark::DoNotOptimize(::read(descriptor, block, sizeof block));
    ::close(descriptor);
}

void addForeign(RatioTable& table, const char* name, const char* text,
                const std::filesystem::path& folder) {
    if (!std::filesystem::is_directory(folder))
        return;
    const std::shared_ptr<Files> files = foreignFiles(folder);
    table.add({name, text, "status, open, one read, close"}, eachFile(files, explain),
              eachFile(files, readOnce));
}

} // namespace

void addToolsComparisons(RatioTable& table) {
    addForeign(table, "tools/foreign", "explain one file of the system's libraries",
               "/usr/lib/x86_64-linux-gnu");
    addForeign(table, "tools/foreignWindows", "explain one file of Wine's libraries",
               "/usr/lib/x86_64-linux-gnu/wine/x86_64-windows");
}

} // namespace Mz::Benchmarks
