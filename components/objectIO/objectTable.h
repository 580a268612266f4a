// SPDX-License-Identifier: BSL-1.0
/// The numbered references of an object IO to its objects.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace Mz {

/// The references to the objects of one IO, numbered from 1 in the order in which the objects
/// begin.
///
/// The destructor releases them in the reverse of the order in which the objects ended. An object
/// received its references to others while it was read or written, so these ended before it; the
/// exception, an object around it, closes a cycle. Each release therefore frees at most one object,
/// and a chain of any length is freed in a loop. Releasing it from the other end would recurse
/// through the whole chain.
template <class Reference>
class ObjectTable {
  public:
    ObjectTable() = default;
    ObjectTable(const ObjectTable&) = delete;
    ObjectTable& operator=(const ObjectTable&) = delete;
    ~ObjectTable() {
        for (; !ended.empty(); ended.pop_back())
            references[ended.back() - 1].reset();
    }

    std::size_t size() const { return references.size(); }
    /// Returns the reference with this number, from 1 to `size()`.
    const Reference& at(std::uint32_t number) const { return references[number - 1]; }

    /// One object while it is read or written. The table keeps its reference, also after a failure.
    class Entry {
      public:
        Entry(ObjectTable& table, Reference object) : table(table) {
            table.references.push_back(std::move(object));
            number = static_cast<std::uint32_t>(table.references.size());
            try {
                // The destructor appends the number and must not need memory.
                table.ended.reserve(table.references.capacity());
            } catch (...) {
                table.references.pop_back();
                throw;
            }
        }
        ~Entry() { table.ended.push_back(number); }
        Entry(const Entry&) = delete;
        Entry& operator=(const Entry&) = delete;

      private:
        ObjectTable& table;
        std::uint32_t number = 0;
    };

  private:
    std::vector<Reference> references;
    std::vector<std::uint32_t> ended;
};

} // namespace Mz
