// SPDX-License-Identifier: BSL-1.0
/// Tests what new memory contains where `check` looks for numbers that nothing initialised.
#include "components/componentTools/platform/resources.h"

#include <gtest/gtest.h>

#include <cstdlib>

using namespace Mz::Tools;

namespace {

/// Returns a byte of a new block, after a block of that size with another content was freed.
unsigned char byteOfANewBlock(std::size_t size, unsigned char pattern) {
    const auto newBlock = [size] {
        return static_cast<volatile unsigned char*>(std::malloc(size));
    };
    const auto free = [](volatile unsigned char* block) {
        std::free(const_cast<unsigned char*>(block));
    };
    volatile unsigned char* const used = newBlock();
    for (std::size_t index = 0; index < size; ++index)
        used[index] = 0x11;
    free(used);
    System::fillNewMemory(pattern);
    volatile unsigned char* const block = newBlock();
    const unsigned char byte = block[size - 1];
    free(block);
    return byte;
}

TEST(NewMemory, DiffersWithThePatternThoughABlockIsTakenAgain) {
    for (const std::size_t size : {32U, 64U, 200U, 512U, 1000U, 1024U, 5000U})
        EXPECT_NE(byteOfANewBlock(size, 0x5A), byteOfANewBlock(size, 0xA5)) << size;
    System::fillNewMemory(0);
}

} // namespace
