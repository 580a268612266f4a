// SPDX-License-Identifier: BSL-1.0
/// Import builders: builders that read a foreign file into an object.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/enumerator.h"
#include "components/componentManager/export.h"

namespace Mz {

/// A builder that reads one kind of foreign file.
///
/// It is a component builder that also supports this interface, and is registered under the builder
/// name of its importer. Its object therefore supports `QrComponentBuilder`, `QrImportBuilder` and
/// `QrBuilderDescription`. `QrCastMulti` implements such objects; `Mz::Kit::ImportBuilder` of the
/// component kit is the shortest way.
///
/// In all functions, `path` is the name that the caller passed, not necessarily the name under
/// which the file was found. `hint` is a second text, which this library passes on without
/// interpretation.
///
/// A class that overrides one form of `canImport` or `import` hides the other. Declare in it:
///
///     using QrImportBuilder::canImport;
///     using QrImportBuilder::import;
class MZ_COMPONENT_MANAGER_API QrImportBuilder : public QrCastable {
  public:
    using Self = QrImportBuilder;
    static constexpr QrUid uid{0xAD148682, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrImportBuilder() override;

    /// Passes every file extension that this builder reads to `e`, without dot or wildcard
    /// (L"obj").
    ///
    /// \return the result of the enumeration (see `enumerator.h`)
    virtual QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const = 0;

    /// Returns whether this builder can import the data of `io`. The function may read; the caller
    /// restores the position.
    ///
    /// \param io  input, positioned at the start of the data; not null
    virtual bool canImport(QrPtr<QrBufferedIO> io, const wchar_t* path,
                           const wchar_t* hint) const = 0;

    /// Returns whether this builder can import the file `path`. Opens the file, without denying any
    /// access to other openers, calls the buffer form, and closes the file.
    ///
    /// \param path  name of the file, relative to the current directory; may be null or empty
    /// \return false also if `path` is null or empty, or if the file cannot be opened
    /// \throws only what the buffer form throws; the file is closed first
    virtual bool canImport(const wchar_t* path, const wchar_t* hint) const;

    /// Returns the object that the data of `io` describes, or null if the data cannot be imported.
    /// The builder reports the reason to the process controller.
    ///
    /// \param io  input, positioned at the start of the data; not null. It may be destroyed after
    ///            the call, so the object must not keep it.
    virtual QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* hint) const = 0;

    /// Returns the object that the file `path` describes. Opens the file as `canImport` does, calls
    /// the buffer form, and closes the file before it returns.
    ///
    /// \param path  name of the file, relative to the current directory; may be null or empty
    /// \return null also if `path` is null or empty, or if the file cannot be opened
    /// \throws only what the buffer form throws; the file is closed first
    virtual QrRef<QrCastable> import(const wchar_t* path, const wchar_t* hint) const;
};

} // namespace Mz
