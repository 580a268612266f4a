/// The objects that an object IO holds, by number.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

namespace Mz {

/// References to the objects of one IO, numbered from 1 in the order in which they begin.
///
/// When the table is destroyed it drops the references in the reverse of the order in which the
/// objects ended. An object that ended holds only objects that ended before it, since it got them
/// while it was read or written; the exception, an object around it, closes a circle. So each
/// reference that is dropped frees one object at most, and a chain of objects, however long, is
/// freed in a loop, where dropping it from the other end would recurse through all of it.
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
    const Reference& at(std::uint32_t number) const { return references[number - 1]; }

    /// One object while it is read or written. Its reference is in the table from now on, whether
    /// it ends well or not.
    class Entry {
      public:
        Entry(ObjectTable& table, Reference object) : table(table) {
            table.references.push_back(std::move(object));
            number = static_cast<std::uint32_t>(table.references.size());
            try {
                // The end of an object must find room for its number.
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
