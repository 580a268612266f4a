// SPDX-License-Identifier: BSL-1.0
/// Depends on the working folder.
#include "tests/checks/components/broken.h"

#include <filesystem>

class Object final : public Mz::Test::Stored {
  public:
    Object() { number = std::filesystem::current_path().has_relative_path() ? 1 : 0; }
    void read(Mz::QrStream& stream) override { stream >> number; }
};

MZ_BROKEN_OBJECT(Object)
