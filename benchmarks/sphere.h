// SPDX-License-Identifier: BSL-1.0
/// The mesh that the benchmarks import.
#pragma once

#include <cstddef>
#include <string>

namespace Mz::Benchmarks {

inline constexpr int sphereRings = 84;
inline constexpr int sphereSegments = 75;
inline constexpr std::size_t sphereVertices = std::size_t{sphereRings + 1} * sphereSegments;
inline constexpr std::size_t sphereFaces = std::size_t{sphereRings} * sphereSegments;

/// Returns a sphere of quadrangles as OBJ text, 330 KB.
std::string sphere();

/// Returns the path of a file with that text, which is removed at the end of the program.
const std::string& sphereFile();

} // namespace Mz::Benchmarks
