// SPDX-License-Identifier: BSL-1.0
/// An interface and its edits. `MZ_EDIT_name` selects one; without it the header is the original.
#pragma once

#include "components/componentManager/fingerprint.h"

#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace Edited {

inline namespace v1 {

#ifdef MZ_EDIT_enumerationWidened
enum class Style : std::uint64_t { plain, bold };
#else
enum class Style : std::uint8_t { plain, bold };
#endif

} // namespace v1

/// Passed by value.
struct Place {
    double x, y;
#ifdef MZ_EDIT_valueGrown
    double z;
#endif
#ifdef MZ_EDIT_valueDestroyed
    ~Place();
#endif
#ifdef MZ_EDIT_valueVirtual
    virtual ~Place();
#endif
};

template <Style style, class T>
struct Styled {
    T* value;
};

/// A second base, without `QrCastable`.
class Watched {
  public:
#ifdef MZ_EDIT_virtualDestructor
    virtual ~Watched() = default;
#endif
    virtual void watched() = 0;
#ifndef MZ_EDIT_virtualDestructor
  protected:
    ~Watched() = default;
#endif
};

class Named : public Mz::QrCastable {
  public:
    virtual const char* name() const = 0;
};

#if defined(MZ_EDIT_base)
class Greeter : public Named, public Watched {
#elif defined(MZ_EDIT_baseRemoved)
class Greeter : public Mz::QrCastable {
#elif defined(MZ_EDIT_basesReordered)
class Greeter : public Watched, public Mz::QrCastable {
#else
class Greeter : public Mz::QrCastable, public Watched {
#endif
  public:
    using Self = Greeter;
    static constexpr Mz::QrUid uid{0xE1, 0xE2, 0xE3, 0xE4};

#ifdef MZ_EDIT_reordered
    virtual int count(int least) = 0;
#endif
#ifdef MZ_EDIT_constRemoved
    virtual const char* greeting() = 0;
#elif defined(MZ_EDIT_result)
    virtual std::string greeting() const = 0;
#elif defined(MZ_EDIT_renamed)
    virtual const char* salute() const = 0;
#elif defined(MZ_EDIT_noexceptAdded)
    virtual const char* greeting() const noexcept = 0;
#elif defined(MZ_EDIT_nodiscard)
[[nodiscard]] virtual const char* greeting() const = 0;
#else
virtual const char* greeting() const = 0;
#endif
#ifdef MZ_EDIT_inserted
    virtual void added() = 0;
#endif
#ifdef MZ_EDIT_insertedUnlisted
    virtual void added() = 0;
#endif
#if defined(MZ_EDIT_parameterRenamed)
    virtual void setGreeting(const std::string& words) = 0;
#elif defined(MZ_EDIT_alias)
    using Text = std::string;
    virtual void setGreeting(Text const& text) = 0;
#elif !defined(MZ_EDIT_removed)
    virtual void setGreeting(const std::string& text) = 0;
#endif
#ifdef MZ_EDIT_overloadAdded
    virtual void setGreeting(const wchar_t* text) = 0;
#endif
#ifdef MZ_EDIT_argument
    virtual int count(long least) = 0;
#elif defined(MZ_EDIT_argumentAdded)
    virtual int count(int least, int most) = 0;
#elif defined(MZ_EDIT_defaultArgument)
    virtual int count(int least = 3) = 0;
#elif !defined(MZ_EDIT_reordered)
    virtual int count(int least) = 0;
#endif
    virtual Place place(Style style) const = 0;
    virtual void all(std::map<std::string, std::vector<Style>>& styles, Styled<Style::bold, Place>,
                     void (*visit)(const unsigned long*, char[3]), const long (&numbers)[4]) = 0;
#ifdef MZ_EDIT_appended
    virtual void added() = 0;
#endif
#ifdef MZ_EDIT_helper
    int twice() {
        return count(0) * 2;
    }
    static int none() {
        return 0;
    }
#endif

#ifdef MZ_EDIT_member
    int member;
#endif

  private:
#ifdef MZ_EDIT_privateAppended
    virtual void hidden();
#endif
};

#if defined(MZ_EDIT_inserted) || defined(MZ_EDIT_appended)
MZ_INTERFACE(Greeter, greeting, added, setGreeting, count, place, all, MZ_BASE(Watched))
#elif defined(MZ_EDIT_removed)
MZ_INTERFACE(Greeter, greeting, count, place, all, MZ_BASE(Watched))
#elif defined(MZ_EDIT_renamed)
MZ_INTERFACE(Greeter, salute, setGreeting, count, place, all, MZ_BASE(Watched))
#elif defined(MZ_EDIT_baseRemoved)
MZ_INTERFACE(Greeter, greeting, setGreeting, count, place, all)
#elif defined(MZ_EDIT_overloadAdded)
MZ_INTERFACE(Greeter, greeting, MZ_OPERATION(setGreeting, void(const std::string&)),
             MZ_OPERATION(setGreeting, void(const wchar_t*)), count, place, all, MZ_BASE(Watched))
#elif defined(MZ_EDIT_fewerListed)
MZ_INTERFACE(Greeter, place, greeting)
#elif defined(MZ_EDIT_noMacro)
#else
MZ_INTERFACE(Greeter, greeting, setGreeting, count, place, all, MZ_BASE(Watched))
#endif

/// Another interface, which is the same in all edits but one.
class Other : public Mz::QrCastable {
  public:
    using Self = Other;
#ifdef MZ_EDIT_ownUid
    static constexpr Mz::QrUid uid{0xF1, 0xE2, 0xE3, 0xE5};
    virtual void changed() = 0;
#else
    static constexpr Mz::QrUid uid{0xE1, 0xE2, 0xE3, 0xE5};
#endif
    virtual void other(Mz::QrRef<Greeter> greeter) = 0;
};
MZ_INTERFACE(Other, other)

} // namespace Edited
