#include "tests/mesh/fullMedium.h"

#include <csignal>
#include <sys/resource.h>

namespace Meshes {

std::filesystem::path unwritableFolder() {
    return "/proc/self";
}

bool hasLinksAndPermissions() {
    return true;
}

namespace {

void limitFiles(rlim_t size) {
    rlimit limit{};
    ::getrlimit(RLIMIT_FSIZE, &limit);
    limit.rlim_cur = size;
    ::setrlimit(RLIMIT_FSIZE, &limit);
}

} // namespace

FullMedium::FullMedium(std::size_t size) {
    std::signal(SIGXFSZ, SIG_IGN); // Writing then fails instead.
    limitFiles(size);
}

FullMedium::~FullMedium() {
    limitFiles(RLIM_INFINITY);
}

bool FullMedium::isSupported() {
    return true;
}

} // namespace Meshes
