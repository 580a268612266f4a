/// The base of every exception that the library family throws.
#pragma once

#include "components/base/export.h"

#include <string>

namespace Mz {

/// What is known of one failure: where it was thrown, and why.
///
/// `ExBase` is deliberately no `std::exception`: every concrete class derives from
/// `std::runtime_error` first and from its scope class (and through it from `ExBase`) second. Were
/// `ExBase` a `std::exception` too, that base would be ambiguous and `catch (std::exception&)`
/// would miss the whole family.
///
/// All texts are copies of its own, so an exception stays valid when the library that threw it is
/// unloaded or the caller's buffers are gone. Distinct objects may be used from distinct threads.
class MZ_BASE_API ExBase {
  public:
    /// Records the source position of the throw. `file` has the form `components/<library>/<file>`,
    /// without extension; null counts as empty. The reason starts out empty.
    ExBase(const char* file, int line);
    ExBase(const ExBase& other);
    ExBase& operator=(const ExBase& other);

    /// Why it was thrown: never null, valid as long as this object and its reason are unchanged.
    virtual const char* getReason() const;

    /// Position and reason in one text, `file(line): reason`. Lives as long as `getReason()`.
    virtual const char* getDetailedReason() const;

    virtual ~ExBase();

    /// A copy on the heap, of the same dynamic type, which the caller deletes through the
    /// `ExBase`; null when there is no memory for it.
    virtual ExBase* clone() const = 0;

  protected:
    /// Replaces the reason by a copy of `reason`; null counts as empty.
    void setReason(const char* reason);

  private:
    std::string position;
    std::string reason;
    std::string detailedReason;
};

} // namespace Mz
