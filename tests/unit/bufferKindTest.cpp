// SPDX-License-Identifier: BSL-1.0
// Tests how the library recognises the buffers of the standard library.
#include "components/componentManager/buffers/standardBuffer.h"

#include <gtest/gtest.h>

#include <typeinfo>

using namespace Mz;

namespace {

/// A second description of a class, as a library loaded apart from the others has one.
class Description final : public std::type_info {
  public:
    explicit Description(const std::type_info& original) : std::type_info(original.name()) {}
};

class DerivedMemory final : public std::stringbuf {};

TEST(BufferKind, IsThatOfTheExactClass) {
    EXPECT_EQ(bufferKind(std::stringbuf()), BufferKind::Memory);
    EXPECT_EQ(bufferKind(std::filebuf()), BufferKind::File);
    EXPECT_EQ(bufferKind(DerivedMemory()), BufferKind::Foreign);
    EXPECT_EQ(bufferKind(DerivedMemory()), BufferKind::Foreign) << "as found last";
}

TEST(BufferKind, ComparesTheNamesOfSeveralDescriptionsOfAClass) {
    // Static: the address of the one that was found last not to be standard stays known.
    static const Description memory(typeid(std::stringbuf));
    static const Description file(typeid(std::filebuf));
    static const Description foreign(typeid(DerivedMemory));
    EXPECT_EQ(bufferKindByName(memory), BufferKind::Memory);
    EXPECT_EQ(bufferKindByName(file), BufferKind::File);
    EXPECT_EQ(bufferKindByName(foreign), BufferKind::Foreign);
    EXPECT_EQ(bufferKindByName(memory), BufferKind::Memory);
    EXPECT_EQ(bufferKindByName(foreign), BufferKind::Foreign);
    EXPECT_EQ(bufferKindByName(typeid(DerivedMemory)), BufferKind::Foreign);
    EXPECT_EQ(bufferKindByName(file), BufferKind::File);
}

} // namespace
