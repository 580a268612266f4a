// SPDX-License-Identifier: BSL-1.0
/// A start with plug-ins of POCO in a new process: mzPeerStartPoco load FOLDER
///
/// Loads each plug-in, which tells the names of its classes, with one class loader.
#include "dllPart.h"
#include "freshResult.h"

#include <Poco/ClassLoader.h>

int main(int argc, char** argv) {
    if (argc != 3)
        return 2;
    const std::vector<std::string> files = Mz::Benchmarks::filesOf(argv[2]);
    Poco::ClassLoader<DllPart> loader;
    const Mz::Benchmarks::Measurement measurement;
    for (const std::string& file : files)
        loader.loadLibrary(file);
    const double end = Mz::Benchmarks::measuredTime();
    long count = 0;
    for (auto library = loader.begin(); library != loader.end(); ++library)
        count += static_cast<long>(library->second->size());
    return measurement.print(end, count);
}
