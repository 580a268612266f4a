#include "tests/mesh/unwritableFolder.h"

namespace Meshes {

std::filesystem::path unwritableFolder() {
    // No name in it can have this character.
    return L"C:\\a?b";
}

} // namespace Meshes
