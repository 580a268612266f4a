// SPDX-License-Identifier: BSL-1.0
/// The parts of the Wavefront OBJ format that this example needs, without anything of plug-ins:
/// vertices, faces, materials, and the material libraries (MTL files) in which these are defined.
#pragma once

#include "model.h"

#include <functional>
#include <istream>
#include <stdexcept>
#include <string>
#include <vector>

/// What an OBJ file contains.
struct ObjData {
    std::size_t vertices = 0;
    std::vector<Model::Material> materials; ///< those that have faces
};

/// Why a file is invalid, with the number of the line.
class ObjError : public std::runtime_error {
  public:
    ObjError(std::size_t line, const std::string& reason)
        : std::runtime_error("line " + std::to_string(line) + ": " + reason) {}
};

/// Returns the materials that the library `name` defines; empty if there is no such library.
using MaterialSource = std::function<std::vector<Model::Material>(const std::string& name)>;

/// Returns whether the first statement of the file is one of the format.
bool looksLikeObj(std::istream& in);

/// Returns the content of an OBJ file. Calls `library` for each material library.
///
/// \throws ObjError  if the file is invalid
ObjData readObj(std::istream& in, const MaterialSource& library);

/// Returns the materials of an MTL file.
///
/// \throws ObjError  if the file is invalid
std::vector<Model::Material> readMtl(std::istream& in);
