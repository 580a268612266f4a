// SPDX-License-Identifier: BSL-1.0
/// Stores a number that nothing initialised, in a block that held a message of the check, if there
/// is one.
#include "tests/checks/components/broken.h"

#include <cstdlib>
#include <string_view>

namespace {

/// Calls `use` with new blocks of each small size, as often as the heap keeps free ones apart.
template <class Use>
void forEachNewBlock(Use use) {
    for (std::size_t size = 64; size <= 1024; size += 16) {
        std::vector<void*> blocks;
        for (int copy = 0; copy < 4; ++copy) {
            blocks.push_back(std::malloc(size));
            use(std::string_view(static_cast<const char*>(blocks.back()), size));
        }
        for (void* block : blocks)
            std::free(block);
    }
}

} // namespace

class Object final : public Mz::Test::Stored {
  public:
    Object() {
        bool left = false;
        forEachNewBlock([&](std::string_view block) {
            // Not the first bytes, which the heap itself uses.
            const bool ofMessage = block.find("\"what\":\"createObject\"", 16) != block.npos;
            if (!left)
                number = static_cast<unsigned char>(ofMessage ? '\0' : block[40]);
            left = left || ofMessage;
        });
    }
};

MZ_BROKEN_OBJECT(Object)
