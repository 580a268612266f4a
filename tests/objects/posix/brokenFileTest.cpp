// SPDX-License-Identifier: BSL-1.0
// Reads objects from a file that fails before its end: the memory of this process, in which the
// bytes end where no memory is mapped.
#include "tests/objects/places.h"

#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#include <cstring>

namespace {

using namespace Mz;
using namespace Mz::Test;

/// Bytes behind which no memory is mapped.
class BytesAtAnEdge {
  public:
    explicit BytesAtAnEdge(std::string_view bytes)
        : size(2 * static_cast<std::size_t>(::sysconf(_SC_PAGESIZE))),
          memory(static_cast<char*>(
              ::mmap(nullptr, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0))),
          begin(memory + size / 2 - bytes.size()) {
        std::memcpy(begin, bytes.data(), bytes.size());
        ::munmap(memory + size / 2, size / 2);
    }
    ~BytesAtAnEdge() { ::munmap(memory, size / 2); }
    BytesAtAnEdge(const BytesAtAnEdge&) = delete;
    BytesAtAnEdge& operator=(const BytesAtAnEdge&) = delete;

    std::streamoff position() const {
        return static_cast<std::streamoff>(reinterpret_cast<std::uintptr_t>(begin));
    }

  private:
    const std::size_t size;
    char* const memory;
    char* const begin;
};

template <class Stream>
class BrokenFile : public Place<Stream> {};
TYPED_TEST_SUITE(BrokenFile, StreamKinds);

TYPED_TEST(BrokenFile, HasThePlacesThatItTold) {
    std::mt19937 engine(20'263);
    int told = 0;
    for (int round = 0; round < 60 && !testing::Test::HasFailure(); ++round) {
        const std::string whole = this->randomObjects(engine);
        const BytesAtAnEdge bytes(std::string_view(whole).substr(0, 1 + engine() % whole.size()));
        for (const std::size_t held : {std::size_t{2}, std::size_t{40}, whole.size() / 2})
            told += this->tellsTheSame("/proc/self/mem", bytes.position(), held);
    }
    EXPECT_GT(told, 100);
}

TYPED_TEST(BrokenFile, HasThePlaceAtWhichNothingCanBeRead) {
    const BytesAtAnEdge nothing("");
    std::ifstream source("/proc/self/mem", std::ios::binary);
    source.seekg(nothing.position());
    QrInBuffer buffer(&source);
    QrObjectInBuffer objects(&buffer);
    TypeParam stream(&objects);
    EXPECT_THAT(readFailure([&] { stream.readObject(nullptr, nullptr, nullptr); }),
                testing::StartsWith("byte " + std::to_string(nothing.position()) + ": "));
}

} // namespace
