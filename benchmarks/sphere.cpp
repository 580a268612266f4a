// SPDX-License-Identifier: BSL-1.0
// Rows of vertices from pole to pole, and a quadrangle between each four.
#include "sphere.h"

#include "temporaryFile.h"

#include <cmath>
#include <cstdio>
#include <fstream>
#include <numbers>

namespace Mz::Benchmarks {

std::string sphere() {
    constexpr int rings = sphereRings, segments = sphereSegments;
    std::string text;
    char line[96];
    const auto add = [&](auto... values) {
        text.append(line, static_cast<std::size_t>(std::snprintf(line, sizeof line, values...)));
    };
    for (int ring = 0; ring <= rings; ++ring)
        for (int segment = 0; segment < segments; ++segment) {
            const double up = std::numbers::pi * ring / rings;
            const double around = 2 * std::numbers::pi * segment / segments;
            add("v %.6f %.6f %.6f\n", std::sin(up) * std::cos(around), std::cos(up),
                std::sin(up) * std::sin(around));
        }
    for (int ring = 0; ring < rings; ++ring)
        for (int segment = 0; segment < segments; ++segment) {
            const int here = ring * segments + segment + 1;
            const int next = ring * segments + (segment + 1) % segments + 1;
            add("f %d %d %d %d\n", here, next, next + segments, here + segments);
        }
    return text;
}

const std::string& sphereFile() {
    static const TemporaryFile file(".obj");
    static const bool written = static_cast<bool>(std::ofstream(file.path()) << sphere());
    static_cast<void>(written);
    return file.path();
}

} // namespace Mz::Benchmarks
