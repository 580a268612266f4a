// SPDX-License-Identifier: BSL-1.0
/// The base of builders that import foreign files.
#pragma once

#include "components/componentKit/builder.h"
#include "components/componentManager/importBuilder.h"

#include <initializer_list>
#include <vector>

namespace Mz::Kit {

/// The base of a builder, `Impl`, that imports foreign files. `Impl` implements the buffer forms of
/// `canImport` and `import`.
///
/// `Impl` overrides one of two forms of each function, which hides the other. Declare in it:
///
///     using ImportBuilder::canImport;
///     using ImportBuilder::import;
template <class Impl>
class ImportBuilder : public Builder<Impl, QrImportBuilder> {
  public:
    /// Creates a builder that reads files with these extensions.
    ///
    /// \param fileExtensions  extensions without dot or wildcard (L"obj"). They are stored as
    ///                        pointers, like all texts.
    ImportBuilder(const BuilderInfo& builderInfo,
                  std::initializer_list<const wchar_t*> fileExtensions)
        : Builder<Impl, QrImportBuilder>(builderInfo), extensions(fileExtensions) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        for (const wchar_t* extension : extensions)
            if (const QrEnum::Action action = e.process(extension))
                return action;
        return e.finished();
    }

    /// Returns null: an object exists only as the result of an import.
    QrRef<QrCastable> createObject() override { return nullptr; }

  private:
    std::vector<const wchar_t*> extensions;
};

} // namespace Mz::Kit
