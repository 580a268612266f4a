// SPDX-License-Identifier: BSL-1.0
/// The base class of all exceptions of the library family.
#pragma once

#include "components/base/export.h"

#include <string>

namespace Mz {

/// The base class of all exceptions: the source position of the throw, and the reason.
///
/// `ExBase` deliberately does not derive from `std::exception`. Every concrete class derives from
/// `std::runtime_error` first and from its scope class (and through it from `ExBase`) second. If
/// `ExBase` derived from `std::exception` too, that base would be ambiguous and
/// `catch (std::exception&)` would miss the whole family.
///
/// The object owns copies of all texts. On Windows it must not outlive the library that threw it,
/// which contains its destructor; a `clone()` may. Different threads can use different objects.
class MZ_BASE_API ExBase {
  public:
    /// Records the source position of the throw; the reason is empty.
    ///
    /// \param file  source name of the form `components/<library>/<file>`, without extension; null
    ///              counts as empty
    /// \param line  source line
    /// \throws std::bad_alloc  if memory runs out. The copy operations throw it too.
    ExBase(const char* file, int line);
    ExBase(const ExBase& other);
    ExBase& operator=(const ExBase& other);

    /// Returns the reason of the exception. It is never null, and valid until the reason changes or
    /// this object is destroyed.
    virtual const char* getReason() const;

    /// Returns position and reason in one text, `file(line): reason`, with the lifetime of
    /// `getReason()`. Before a reason is set, the text is `file(line)`.
    virtual const char* getDetailedReason() const;

    virtual ~ExBase();

    /// Returns a heap copy of the same dynamic type, or null if memory runs out. The caller owns
    /// the copy and deletes it through the `ExBase` pointer.
    virtual ExBase* clone() const = 0;

  protected:
    /// Replaces the reason by a copy of `reason`; null counts as empty.
    ///
    /// \throws std::bad_alloc  if memory runs out; the old reason stays
    void setReason(const char* reason);

  private:
    std::string position;
    std::string reason;
    std::string detailedReason;
};

} // namespace Mz
