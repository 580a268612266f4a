// SPDX-License-Identifier: BSL-1.0
/// Pieces of code that must not compile, one at a time.
#include "components/componentManager/cast.h"

using namespace Mz;

class Gauge : public QrCastable {
  public:
    using Self = Gauge;
    static constexpr QrUid uid{0x3C5A0001, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
};
class InheritsUid : public Gauge {};
class InheritsSelf : public Gauge {
  public:
    static constexpr QrUid uid{0x3C5A0002, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
};
class Plain : public QrCastImpl<Plain, Gauge> {};

void compiles(QrCastable* object, const QrPtr<Gauge>& gauge) {
    safeCast<Gauge>(object)->release();
    static_cast<void>(queryCast<Gauge>(object));
    const QrCPtr<QrCastable> constant = gauge;
#ifdef REFUSAL_inheritedUid
    safeCast<InheritsUid>(object);
#endif
#ifdef REFUSAL_inheritedSelf
    queryCast<InheritsSelf>(object);
#endif
#ifdef REFUSAL_implementation
    safeCast<Plain>(object);
#endif
#ifdef REFUSAL_queriedRoot
    queryCast<QrCastable>(object);
#endif
#ifdef REFUSAL_throwBadCast
    QrCastable::throwBadCast();
#endif
#ifdef REFUSAL_loseConst
    const QrPtr<QrCastable> lost = constant;
#endif
#ifdef REFUSAL_downConversion
    const QrPtr<Plain> down = gauge;
#endif
}
