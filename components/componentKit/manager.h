// SPDX-License-Identifier: BSL-1.0
/// The component manager in the fewest words: start, objects, and the list of builders.
///
/// Threads: as for `QrComponentManager`, whose functions these call.
///
/// \since 0.2
#pragma once

#include "components/componentKit/names.h"
#include "components/componentManager/componentImp.h"

#include <concepts>
#include <filesystem>
#include <functional>
#include <type_traits>
#include <utility>
#include <vector>

namespace Mz::Kit {

/// Initialises the component manager with the component libraries in `folder`. Works once, like
/// `QrComponentManager::initialize`.
///
/// The folder need not exist; there are no builders then. Pass the folder as a full path or
/// relative to the current folder. For several folders, call the manager's own function with their
/// `searchPath`s, joined by L";".
///
/// \return the full path of the folder, for messages
/// \throws std::system_error  if the name is not valid text in this locale
/// \throws std::filesystem::filesystem_error  if `folder` is relative and the current folder is
///     gone
inline std::filesystem::path initialize(const std::filesystem::path& folder) {
    QrGetComponentManager()->initialize(searchPath(folder).c_str());
    return fullPath(folder);
}

/// Returns a new object of the builder `uid`, as the interface `Iface`. Loads the builder's
/// library, if necessary.
///
/// The caller owns the reference. Release it before `main` returns.
///
/// \return the object; null if the manager is not initialised, if no builder has this uid, if its
///     library cannot be loaded, if it makes no object, or if the object does not support `Iface`.
///     `mzcomponents explain --load FILE` tells which of them it is for a component library
/// \throws whatever the library's own code throws
template <class Iface>
QrPtr<Iface> create(const QrUid& uid) {
    return queryCast<Iface>(QrGetComponentManager()->createObject(uid).get());
}

/// Calls `visit(builder)` for each builder that the manager knows, in its order. Loads no library.
///
///     Mz::Kit::forEachBuilder([](const Mz::QrBuilderDescription& builder) {
///         std::wcout << builder.getLabel() << L'\n';
///     });
///
/// \param visit  takes a `const QrBuilderDescription&` and returns nothing, or a `QrEnum::Action`,
///     of which `Stop` ends the enumeration
/// \return `QrEnum::Continue`, or the action with which `visit` ended the enumeration
/// \throws whatever `visit` throws
template <class Visit>
requires std::invocable<Visit&, const QrBuilderDescription&> QrEnum::Action
forEachBuilder(Visit&& visit) {
    using Result = std::invoke_result_t<Visit&, const QrBuilderDescription&>;
    static_assert(std::is_void_v<Result> || std::is_same_v<Result, QrEnum::Action>,
                  "the function for each builder returns neither void nor Mz::QrEnum::Action:"
                  " return one of them");
    class Visitor final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
      public:
        explicit Visitor(Visit& callable) : visit(callable) {}

        Action process(QrCPtr<QrBuilderDescription> builder) override {
            if constexpr (std::is_void_v<Result>)
                return std::invoke(visit, std::as_const(*builder)), Continue;
            else
                return std::invoke(visit, std::as_const(*builder));
        }

      private:
        Visit& visit;
    };
    Visitor visitor(visit);
    return QrGetComponentManager()->enumerateBuilders(visitor);
}

/// Returns the builders that the manager knows, in its order. Loads no library.
///
///     for (const auto& builder : Mz::Kit::builders())
///         std::wcout << builder->getLabel() << L'\n';
///
/// The list is a copy. Its entries refer to the manager's records, which live as long as the
/// manager. To make an object, pass `builder->getUid()` to `create`.
inline std::vector<QrCPtr<QrBuilderDescription>> builders() {
    std::vector<QrCPtr<QrBuilderDescription>> all;
    forEachBuilder([&](const QrBuilderDescription& builder) { all.emplace_back(&builder); });
    return all;
}

} // namespace Mz::Kit
