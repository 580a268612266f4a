/// Interfaces that one object supplies on behalf of another.
///
/// An object may lack an interface that some client needs, while another object, its *translator*,
/// can supply it. The process keeps one registry of translators, in order, for each object;
/// `safeCast` and `queryCast` ask it whenever the object itself answers null.
///
/// The registry holds plain pointers. It takes no reference on either object, never deletes one and
/// never looks into the translated object: whoever adds a translation keeps both objects alive and
/// removes the translation before either dies. It is usable during the construction and destruction
/// of static objects.
///
/// Threads: lookups may run side by side; adding or removing must not overlap any other use of the
/// registry. No function here throws, except what a translator or predicate throws and, when
/// adding, `std::bad_alloc` (then nothing was added).
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/uid.h"

#include <atomic>

namespace Mz {

class QrCastable;

namespace detail {

/// True once a translation was added in this process. Casts read it to avoid a call into the
/// registry; only the registry writes it.
extern MZ_COMPONENT_MANAGER_API std::atomic<bool> translationsExist;

} // namespace detail

} // namespace Mz

extern "C" {

/// The interface `uid` of `object` through a translator, or null.
///
/// The first translator of `object` whose predicate accepts `uid` decides: its answer is returned
/// as it is, even when it is null, and later ones are not asked. The result carries one reference,
/// which the caller takes over (`QrPtr<T>::adopt`).
MZ_COMPONENT_MANAGER_API Mz::QrCastable* QrTranslateInterface(Mz::QrCastable* object,
                                                              const Mz::QrUid& uid);

/// Lets `translator` answer for `object` wherever `accepts` says so, after the translators that
/// `object` already has. The same pair may be added more than once. A null `object`, `translator`
/// or `accepts` adds nothing.
MZ_COMPONENT_MANAGER_API void QrAddTranslation(Mz::QrCastable* object, Mz::QrCastable* translator,
                                               bool (*accepts)(const Mz::QrUid& uid));

/// Removes translations of `object` by `translator`, keeping the order of the others.
///
/// Of two such translations that stand directly one after the other a single call removes only the
/// first: the walk goes on behind the entry that moved up. Whoever added the same translator
/// several times calls this as often. Nothing happens when there is nothing to remove.
MZ_COMPONENT_MANAGER_API void QrRemoveTranslation(Mz::QrCastable* object,
                                                  Mz::QrCastable* translator);
}

namespace Mz {
using ::QrAddTranslation;
using ::QrRemoveTranslation;
using ::QrTranslateInterface;
} // namespace Mz
