// SPDX-License-Identifier: BSL-1.0
/// Starts with Qt's plug-ins in a new process: mzPeerStartQt WORK FOLDER
///
///   load      loads each plug-in and makes its instance
///   metaData  reads the data that each plug-in has for those who do not load it: what Qt's own
///             programs do at each start. There is no list of all.
#include "freshResult.h"

#include <QCoreApplication>
#include <QJsonObject>
#include <QPluginLoader>
#include <memory>
#include <string_view>

int main(int argc, char** argv) {
    if (argc != 3)
        return 2;
    const QCoreApplication application(argc, argv);
    const bool load = std::string_view(argv[1]) == "load";
    const std::vector<std::string> files = Mz::Benchmarks::filesOf(argv[2]);
    long count = 0;
    std::vector<std::unique_ptr<QPluginLoader>> kept;
    const Mz::Benchmarks::Measurement measurement;
    for (const std::string& file : files) {
        auto loader = std::make_unique<QPluginLoader>(QString::fromStdString(file));
        const bool found =
            load ? loader->instance() != nullptr
                 : loader->metaData().value("IID").toString() == "mz.benchmarks.Plugin";
        count += found;
        kept.push_back(std::move(loader));
    }
    return measurement.print(Mz::Benchmarks::measuredTime(), count);
}
