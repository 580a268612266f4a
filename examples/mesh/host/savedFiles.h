/// What the host saves, and reads back.
#pragma once

#include "examples/mesh/scene.h"

#include <filesystem>
#include <vector>

namespace Meshes {

/// Saves meshes, each in binary and as text, to files in one folder, and at the end a scene of all
/// of them. Whatever was saved is read back and compared; a line about it is written to the
/// standard output. Failures are `QrStreamEx`, or a `std::runtime_error` when what came back is not
/// equal.
class SavedFiles {
  public:
    /// Makes the folder, where there is none.
    explicit SavedFiles(std::filesystem::path folder);

    /// Saves the mesh that was imported from `file`, and places it in the scene, twice.
    void save(const std::filesystem::path& file, const Mz::QrPtr<Mesh>& mesh);

    void saveScene();

  private:
    std::filesystem::path folder;
    Mz::QrPtr<Scene> scene;
    int meshes = 0;
};

/// Everything in the folder that a `SavedFiles` may have put there, in the order of the names.
std::vector<std::filesystem::path> savedFiles(const std::filesystem::path& folder);

/// Reads one of these files and writes a line about it. Failures are as those of `SavedFiles`.
void loadSavedFile(const std::filesystem::path& file);

} // namespace Meshes
