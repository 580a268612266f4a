// SPDX-License-Identifier: BSL-1.0
/// Objects of another library, of which the measuring program knows only the interface. No call can
/// be inlined or resolved at compile time.
#pragma once

#include "components/base/export.h"
#include "components/componentManager/cast.h"

#include <memory>

#ifdef MZ_BUILDING_PEER
#define MZ_PEER_API MZ_EXPORT
#else
#define MZ_PEER_API MZ_IMPORT
#endif

namespace Mz::Benchmarks {

/// The interface to which the benchmarks cast.
class Gauge : public QrCastable {
  public:
    using Self = Gauge;
    static constexpr QrUid uid{0x7B3C1E01, 0x53A011EF, 0x8D4E20C9, 0x6F10B277};

    virtual long value() const = 0;
};

/// An interface that no object here has.
class Absent : public QrCastable {
  public:
    using Self = Absent;
    static constexpr QrUid uid{0x7B3C1E02, 0x53A011EF, 0x8D4E20C9, 0x6F10B277};
};

/// The limit of the casts: virtual calls.
class Calls {
  public:
    virtual ~Calls() = default;
    virtual long first() = 0;
    virtual long second() = 0;
    virtual long third() = 0;
};

/// The standard library's alternative: a root, a derived interface, and shared ownership.
class MZ_PEER_API SharedRoot {
  public:
    virtual ~SharedRoot();
};

class MZ_PEER_API SharedGauge : public SharedRoot {
  public:
    ~SharedGauge() override;
    virtual long value() const = 0;
};

/// An interface that no shared gauge has.
class MZ_PEER_API SharedAbsent : public SharedRoot {
  public:
    ~SharedAbsent() override;
};

/// The limit of `createObject`.
class Product {
  public:
    virtual ~Product() = default;
    virtual long value() const = 0;
};

class Factory {
  public:
    virtual ~Factory() = default;
    /// Returns a new object. The caller owns it.
    virtual Product* make() = 0;
};

MZ_PEER_API QrCastable* uncountedGauge();
/// Returns a new object without a reference.
MZ_PEER_API QrCastable* newCountedGauge();
MZ_PEER_API Calls* calls();
MZ_PEER_API std::shared_ptr<SharedRoot> newSharedGauge();
MZ_PEER_API Factory* factory();
/// A function whose call costs no more than the call.
MZ_PEER_API void* trivialCall();

} // namespace Mz::Benchmarks
