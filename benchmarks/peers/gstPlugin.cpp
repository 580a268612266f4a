// SPDX-License-Identifier: BSL-1.0
/// An ordinary small plug-in library for GStreamer, with one element. The benchmarks make many
/// copies of it.
///
/// GStreamer knows plug-ins and elements by their names, so each copy needs others. The entry point
/// `gst_plugin_desc` serves a file of any name. Names are made of the generated uid, whose bytes
/// `LibraryFolder` replaces.
#include "generated/identity.h"

#include <cstdio>
#include <gst/gst.h>

namespace Mz::Benchmarks {

namespace {

const char* nameOf(const char* kind, char (&name)[32]) {
    std::snprintf(name, sizeof name, "%s%08x", kind, ownUid.w0);
    return name;
}

void describe(gpointer type, gpointer) {
    gst_element_class_set_static_metadata(GST_ELEMENT_CLASS(type), "Generated", "Generic",
                                          "One of many elements", "benchmarks");
}

gboolean registerElement(GstPlugin* plugin) {
    char name[32];
    const GTypeInfo info{.class_size = sizeof(GstElementClass),
                         .class_init = describe,
                         .instance_size = sizeof(GstElement)};
    const GType type =
        g_type_register_static(GST_TYPE_ELEMENT, nameOf("MzElement", name), &info, {});
    return gst_element_register(plugin, nameOf("mzelement", name), GST_RANK_NONE, type);
}

char pluginName[32];

} // namespace

} // namespace Mz::Benchmarks

extern "C" __attribute__((visibility("default"))) GstPluginDesc gst_plugin_desc;
GstPluginDesc gst_plugin_desc = {GST_VERSION_MAJOR,
                                 GST_VERSION_MINOR,
                                 Mz::Benchmarks::nameOf("mzplugin", Mz::Benchmarks::pluginName),
                                 "One of many plug-ins",
                                 Mz::Benchmarks::registerElement,
                                 "1.0",
                                 "BSD",
                                 "benchmarks",
                                 "benchmarks",
                                 "none",
                                 nullptr,
                                 {}};
