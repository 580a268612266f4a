// SPDX-License-Identifier: BSL-1.0
/// Translators: objects that supply an interface for another object.
///
/// An object may lack an interface that a client needs. Another object, its *translator*, can
/// supply it. The process has one registry, with an ordered list of translators for each object.
/// `safeCast` and `queryCast` consult the registry if the object itself returns null.
///
/// Ownership: the registry holds plain pointers. It takes no references, deletes no objects, and
/// never dereferences the translated object. The caller that adds a translation keeps both objects
/// alive, and removes the translation before it destroys one of them.
///
/// Threads: lookups can run concurrently. Adding or removing must not run concurrently with any
/// other use of the registry. The functions work during the construction and destruction of static
/// objects.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/uid.h"

#include <atomic>

namespace Mz {

class QrCastable;

namespace detail {

/// True after the first translation of the process was added. Casts read it to avoid a call into
/// the registry. Only the registry writes it.
extern MZ_COMPONENT_MANAGER_API std::atomic<bool> translationsExist;

} // namespace detail

} // namespace Mz

extern "C" {

/// Returns the interface `uid` of `object` from one of its translators.
///
/// The first translator whose predicate accepts `uid` decides. Its result is returned even if it is
/// null; later translators are not consulted.
///
/// \param object  translated object; null has no translators
/// \return the translator's result, or null if no translator accepts `uid`. The caller owns one
///         reference (`QrPtr<T>::adopt`).
/// \throws only what the predicates and the translator throw
MZ_COMPONENT_MANAGER_API Mz::QrCastable* QrTranslateInterface(Mz::QrCastable* object,
                                                              const Mz::QrUid& uid);

/// Adds `translator` to the end of the list of `object`. The same pair may be added more than once.
///
/// If any parameter is null, the call is a no-op.
///
/// \param object      object that lacks interfaces
/// \param translator  object that supplies them
/// \param accepts     predicate: whether `translator` supplies the interface `uid`
/// \throws std::bad_alloc  if memory runs out; nothing is added
MZ_COMPONENT_MANAGER_API void QrAddTranslation(Mz::QrCastable* object, Mz::QrCastable* translator,
                                               bool (*accepts)(const Mz::QrUid& uid));

/// Removes `translator` from the list of `object`. The order of the others does not change.
///
/// Of two adjacent entries of the same translator, one call removes only the first, because the
/// scan skips the entry that moves into its place. If you add a translator several times, call this
/// function as many times. If there is no such entry, the call is a no-op.
MZ_COMPONENT_MANAGER_API void QrRemoveTranslation(Mz::QrCastable* object,
                                                  Mz::QrCastable* translator);
}

namespace Mz {
using ::QrAddTranslation;
using ::QrRemoveTranslation;
using ::QrTranslateInterface;
} // namespace Mz
