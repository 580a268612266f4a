// SPDX-License-Identifier: BSL-1.0
/// The graph that the library and its peers save and load: many small objects, some of them shared.
#pragma once

#include "temporaryFile.h"

#include <benchmark/benchmark.h>

#include <cmath>
#include <cstddef>
#include <map>
#include <random>
#include <set>
#include <string>
#include <vector>

namespace Mz::Benchmarks {

/// The number of nodes.
inline constexpr std::size_t nodeCount = 100'000;

/// The content of a node.
struct NodeContent {
    int number = 0;
    double value = 0;
    std::ptrdiff_t link = -1; ///< the index of an earlier node, or -1 for none
};

/// Returns the nodes. Each but the first refers to a random earlier one.
inline const std::vector<NodeContent>& graph() {
    static const std::vector<NodeContent> nodes = [] {
        std::mt19937_64 random(20'001);
        std::uniform_real_distribution<double> real(-1000, 1000);
        std::vector<NodeContent> made(nodeCount);
        for (std::size_t index = 0; index < nodeCount; ++index) {
            made[index].number = static_cast<int>(random());
            made[index].value = real(random);
            if (index > 0)
                made[index].link = static_cast<std::ptrdiff_t>(random() % index);
        }
        return made;
    }();
    return nodes;
}

/// Returns whether the nodes have the content and the links of the graph. Values that went through
/// text may differ in the last digit.
///
/// \param contentOf  a function that returns the content of the node with an index; its `link` is
/// -1
///     for null, and anything else for another object than the earlier node
template <class ContentOf>
bool isGraph(const ContentOf& contentOf) {
    for (std::size_t index = 0; index < nodeCount; ++index) {
        const NodeContent& expected = graph()[index];
        const NodeContent found = contentOf(index);
        if (found.number != expected.number || found.link != expected.link ||
            std::abs(found.value - expected.value) > 1e-12 * std::abs(expected.value))
            return false;
    }
    return true;
}

using SaveGraph = void (*)(const std::string& path);
using CheckGraph = bool (*)(const std::string& path);

/// Measures saving a graph to a file, which is opened for it each time.
///
/// \param save  writes the graph to the file of a path
/// \param check  returns whether the graph can be loaded from that file; called once in a process
inline void measureSaving(benchmark::State& state, SaveGraph save, CheckGraph check) {
    static std::set<SaveGraph> checked;
    const TemporaryFile file;
    for (auto iteration : state) {
        static_cast<void>(iteration);
        save(file.path());
    }
    if (checked.insert(save).second && !check(file.path()))
        state.SkipWithError("something else was saved");
}

/// Measures loading a graph from a file. Releasing the loaded graph is part of the work.
///
/// \param save  writes the graph to the file of a path; called once in a process
/// \param load  loads it
/// \param check  returns whether the graph can be loaded from that file; called once in a process
template <class Loaded>
void measureLoading(benchmark::State& state, SaveGraph save, Loaded (*load)(const std::string&),
                    CheckGraph check) {
    static std::map<SaveGraph, TemporaryFile> files;
    const auto [saved, isNew] = files.try_emplace(save);
    const std::string& path = saved->second.path();
    if (isNew)
        save(path);
    for (auto iteration : state) {
        static_cast<void>(iteration);
        Loaded loaded = load(path);
        benchmark::DoNotOptimize(loaded);
    }
    if (isNew && !check(path))
        state.SkipWithError("something else was loaded");
}

} // namespace Mz::Benchmarks
