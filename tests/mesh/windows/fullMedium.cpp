#include "tests/mesh/fullMedium.h"

namespace Meshes {

std::filesystem::path unwritableFolder() {
    // No name in it can have this character.
    return L"C:\\a?b";
}

bool hasLinksAndPermissions() {
    return false;
}

FullMedium::FullMedium(std::size_t) {}

FullMedium::~FullMedium() = default;

bool FullMedium::isSupported() {
    return false;
}

} // namespace Meshes
