// SPDX-License-Identifier: BSL-1.0
/// A translation for as long as a variable lives: another object supplies an interface that an
/// object lacks. For the rules see `components/componentManager/translation.h`.
///
/// A translator is three lines:
///
///     class Loud final : public Mz::QrCastImpl<Loud, Volume> { int decibels() const override { … }
///     }; Loud loud; const Mz::Kit::Translation<Volume> translation(*greeter, loud);
///
/// \since 0.2
#pragma once

#include "components/componentKit/object.h"
#include "components/componentManager/translation.h"

namespace Mz::Kit {

/// Lets `translator` supply the interfaces `Ifaces` for `object`, from construction to destruction.
///
/// While it exists, `safeCast` and `queryCast` of `object` to one of the interfaces return that of
/// the translator, unless the object has the interface itself. A cast finds the translation only
/// if it starts from the same pointer: pass the object as its clients hold it.
///
/// Ownership: holds a reference to both objects, so that counted objects stay alive. Uncounted ones
/// must outlive it. Threads: construction and destruction must not run concurrently with any other
/// use of the registry of translators. Of one object and one translator there should be one
/// translation at a time: the end of one may end the other.
template <class... Ifaces>
class Translation {
    static_assert(sizeof...(Ifaces) > 0, "this translation has no interface: name at least one,"
                                         " `Kit::Translation<Interface>`");
    static_assert(detail::checkInterfaces<Ifaces...>());

  public:
    /// Adds the translation.
    ///
    /// \throws std::bad_alloc  if memory runs out; nothing is added
    Translation(QrCastable& object, QrCastable& translator)
        : translated(&object), supplier(&translator) {
        QrAddTranslation(&object, &translator,
                         [](const QrUid& wanted) { return ((wanted == Ifaces::uid) || ...); });
    }

    /// Removes the translation.
    ~Translation() { QrRemoveTranslation(translated.get(), supplier.get()); }

    Translation(const Translation&) = delete;
    Translation& operator=(const Translation&) = delete;

  private:
    QrPtr<QrCastable> translated;
    QrPtr<QrCastable> supplier;
};

} // namespace Mz::Kit
