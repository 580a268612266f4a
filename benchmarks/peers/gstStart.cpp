// SPDX-License-Identifier: BSL-1.0
/// Starts with plug-ins of GStreamer in a new process: mzPeerStartGst WORK FOLDER
///
///   first     starts without a registry: loads each plug-in, and writes the registry
///   recorded  starts with the registry that the former has written
///
/// The helper process that GStreamer starts for a scan is switched off, so that its time is
/// measured.
#include "freshResult.h"

#include <cstdlib>
#include <gst/gst.h>
#include <string_view>

int main(int argc, char** argv) {
    if (argc != 3)
        return 2;
    const std::filesystem::path folder = argv[2];
    const std::filesystem::path registry = folder / ".registry";
    if (std::string_view(argv[1]) == "first")
        std::filesystem::remove(registry);
    ::setenv("GST_REGISTRY_1_0", registry.c_str(), 1);
    ::setenv("GST_PLUGIN_SYSTEM_PATH_1_0", "", 1);
    ::setenv("GST_PLUGIN_PATH_1_0", folder.c_str(), 1);
    ::setenv("GST_REGISTRY_FORK", "no", 1);
    const Mz::Benchmarks::Measurement measurement;
    gst_init(nullptr, nullptr);
    const double end = Mz::Benchmarks::measuredTime();
    long count = 0;
    GList* const features =
        gst_registry_get_feature_list(gst_registry_get(), GST_TYPE_ELEMENT_FACTORY);
    for (const GList* item = features; item; item = item->next)
        count += std::string_view(gst_plugin_feature_get_name(GST_PLUGIN_FEATURE(item->data)))
                     .starts_with("mzelement");
    gst_plugin_feature_list_free(features);
    return measurement.print(end, count);
}
