#include "tests/mesh/unwritableFolder.h"

namespace Meshes {

std::filesystem::path unwritableFolder() {
    return "/proc/self";
}

} // namespace Meshes
