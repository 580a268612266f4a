// SPDX-License-Identifier: BSL-1.0
/// The files that the host saves and loads.
#pragma once

#include "examples/mesh/scene.h"

#include <filesystem>
#include <vector>

namespace Meshes {

/// Saves meshes, each in binary and as text, to files in one folder, and a scene of all of them.
///
/// Each file is loaded again and compared, and one line about it goes to the standard output. The
/// operations throw `QrStreamEx`, and `std::runtime_error` if the loaded object is not equal.
class SavedFiles {
  public:
    /// Creates the folder, if it does not exist.
    explicit SavedFiles(std::filesystem::path folder);

    /// Saves the mesh that was imported from `file`, and adds two instances of it to the scene.
    void save(const std::filesystem::path& file, const Mz::QrPtr<Mesh>& mesh);

    /// Saves the scene.
    void saveScene();

  private:
    std::filesystem::path folder;
    Mz::QrPtr<Scene> scene;
    int meshes = 0;
};

/// Returns the files in the folder that have the extensions of saved files, sorted by name.
std::vector<std::filesystem::path> savedFiles(const std::filesystem::path& folder);

/// Loads one of these files and prints one line about it. Throws as the operations of `SavedFiles`.
void loadSavedFile(const std::filesystem::path& file);

} // namespace Meshes
