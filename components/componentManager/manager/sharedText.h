// SPDX-License-Identifier: BSL-1.0
/// The texts of library and builder records.
///
/// A manager keeps a few texts for each library and each builder, for as long as the process runs.
/// A `std::wstring` for each costs 32 bytes even if it is empty, and on Linux, where a character
/// has four bytes, another block for more than three characters. A `SharedText` costs a pointer,
/// and the block only if it is not empty. Copies share the block: the libraries of a folder have
/// one text for it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cwchar>
#include <new>
#include <string_view>
#include <utility>

namespace Mz {

/// An immutable text without NULs. Not thread-safe, not even for two copies.
class SharedText {
  public:
    SharedText() noexcept = default;
    /// \throws std::bad_alloc  if memory runs out
    explicit SharedText(std::wstring_view text) : block(text.empty() ? nullptr : copyOf(text)) {}
    SharedText(const SharedText& other) noexcept : block(other.block) {
        if (block)
            ++block->owners;
    }
    SharedText(SharedText&& other) noexcept : block(std::exchange(other.block, nullptr)) {}
    ~SharedText() {
        if (block && --block->owners == 0)
            ::operator delete(block);
    }
    SharedText& operator=(SharedText other) noexcept {
        std::swap(block, other.block);
        return *this;
    }
    /// \throws std::bad_alloc  if memory runs out; the text has not changed
    SharedText& operator=(std::wstring_view text) { return *this = SharedText(text); }
    SharedText& operator=(const wchar_t* text) { return *this = std::wstring_view(text); }

    /// Returns the text with its terminator. Valid until the last copy of this text is destroyed.
    const wchar_t* c_str() const noexcept { return block ? characters(block) : L""; }
    std::wstring_view view() const noexcept { return c_str(); }
    operator std::wstring_view() const noexcept { return view(); }

    friend bool operator==(const SharedText& a, const SharedText& b) noexcept {
        return a.block == b.block || a.view() == b.view();
    }
    friend bool operator==(const SharedText& a, std::wstring_view b) noexcept {
        return a.view() == b;
    }

  private:
    /// The characters and a terminator follow.
    struct Block {
        std::uint32_t owners;
    };

    static wchar_t* characters(Block* block) noexcept {
        return reinterpret_cast<wchar_t*>(block + 1);
    }

    static Block* copyOf(std::wstring_view text) {
        void* const memory = ::operator new(sizeof(Block) + (text.size() + 1) * sizeof(wchar_t));
        auto* const block = new (memory) Block{1};
        characters(block)[text.copy(characters(block), text.size())] = L'\0';
        return block;
    }

    Block* block = nullptr;
};

} // namespace Mz
