// SPDX-License-Identifier: BSL-1.0
/// Starts with plug-ins of Boost.DLL in a new process: mzPeerStartDll WORK FOLDER
///
///   load    loads each plug-in and imports its factory function
///   query   asks each file for its aliases, without loading it. There is no list of all.
#include "dllPart.h"
#include "freshResult.h"

#include <boost/dll/import.hpp>
#include <boost/dll/library_info.hpp>
#include <boost/function.hpp>
#include <memory>
#include <string_view>

namespace dll = boost::dll;

namespace {

using Factory = std::shared_ptr<DllPart>();

int load(const std::vector<std::string>& files) {
    long count = 0;
    std::vector<boost::function<Factory>> kept;
    const Mz::Benchmarks::Measurement measurement;
    for (const std::string& file : files) {
        kept.push_back(
            dll::import_alias<Factory>(boost::filesystem::path(file), "mzBenchmarkPart"));
        ++count;
    }
    return measurement.print(Mz::Benchmarks::measuredTime(), count);
}

int query(const std::vector<std::string>& files) {
    long count = 0;
    const Mz::Benchmarks::Measurement measurement;
    for (const std::string& file : files) {
        dll::library_info info{boost::filesystem::path(file)};
        for (const std::string& name : info.symbols("boostdll"))
            count += name == "mzBenchmarkPart";
    }
    return measurement.print(Mz::Benchmarks::measuredTime(), count);
}

} // namespace

int main(int argc, char** argv) {
    if (argc != 3)
        return 2;
    const std::vector<std::string> files = Mz::Benchmarks::filesOf(argv[2]);
    return std::string_view(argv[1]) == "load" ? load(files) : query(files);
}
