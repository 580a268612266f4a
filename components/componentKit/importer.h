// SPDX-License-Identifier: BSL-1.0
/// An importer of the import builders with one name.
///
/// A host makes it for itself, without a component of its own:
///
///     const auto importer = Mz::Kit::newImporter<L"settings">();
///     bool found = false;
///     const Mz::QrRef<Mz::QrCastable> object = importer->import(L"editor.ini", nullptr, found);
///
/// A component that offers the importer to other libraries registers it like any class:
///
///     Kit::builderOf<Kit::Importer<L"settings">>({.uid = importerUid, .name = L"importer"})
///
/// \since 0.2
#pragma once

#include "components/componentKit/object.h"
#include "components/componentManager/importer.h"

#include <algorithm>
#include <cstddef>

namespace Mz::Kit {

/// A text that can be the argument of a template, such as the name in `Importer<L"mesh">`.
template <std::size_t size>
struct NameText {
    wchar_t text[size]; ///< the characters and a NUL

    /// Copies the literal.
    consteval NameText(const wchar_t (&literal)[size]) : text() {
        std::copy_n(literal, size, text);
    }
};

/// The importer of the import builders whose builder name is `name`. It supports `QrImporter` and
/// is counted, so create it with `new` or through a builder.
///
/// All functions are those of `QrBaseImporter`, among them `getFileTypes` for file dialogs. Derive
/// from `QrBaseImporter` instead to set a default search path, or to give clients an interface of
/// their own.
template <NameText name>
class Importer final : public Object<Importer<name>, QrBaseImporter> {
    static_assert(name.text[0] != L'\0',
                  "this importer has no name: write the builder name of its import builders");

  public:
    const wchar_t* getBuilderName() const override { return name.text; }
};

/// Returns a new importer of the import builders whose builder name is `name`. The caller owns the
/// reference.
template <NameText name>
QrPtr<Importer<name>> newImporter() {
    return new Importer<name>;
}

} // namespace Mz::Kit
