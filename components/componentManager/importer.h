// SPDX-License-Identifier: BSL-1.0
/// Importers, which find the builder that can read a file.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/importBuilder.h"

#include <string>

namespace Mz {

/// The import of one family of foreign file formats. The import builders of the family are
/// registered under one builder name.
class MZ_COMPONENT_MANAGER_API QrImporter : public QrCastable {
  public:
    using Self = QrImporter;
    static constexpr QrUid uid{0xAD148685, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrImporter() override;

    /// Returns the builder name of the family. It is compared with
    /// `QrBuilderDescription::getName()`, case-sensitively. It is never null, and valid as long as
    /// the importer.
    virtual const wchar_t* getBuilderName() const = 0;

    /// Returns the object that the file `path` describes, and reports whether the file was found.
    /// The implementation here sets `found` to true and calls the other form.
    ///
    /// \param path    name of the file
    /// \param search  directories to search, separated by ';', or null
    /// \param found   false if the file does not exist. True with a null result means that the file
    ///                could not be imported.
    /// \return the object, or null
    virtual QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search, bool& found) const;

    /// Returns the object that the file `path` describes, or null.
    ///
    /// \param path    name of the file
    /// \param search  directories to search, separated by ';', or null
    virtual QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search) const = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// The base of importers. A concrete importer derives from it in a component library and implements
/// only `getBuilderName`.
///
/// The functions use the builders that the component manager of the process has at the time of the
/// call, in its order. The process controller of the calling thread finds files. If a function
/// needs one of the two and it is missing, it throws `QrComponentManagerEx::ExBadCast`. The
/// exceptions of builders and buffers propagate; the file is closed first.
class MZ_COMPONENT_MANAGER_API QrBaseImporter : public QrImporter {
  public:
    QrBaseImporter();
    QrBaseImporter(const QrBaseImporter& other);
    QrBaseImporter& operator=(const QrBaseImporter& other);
    ~QrBaseImporter() override;

    using QrImporter::import;

    /// Passes every import builder of this importer to `e`. Loads their libraries as needed.
    ///
    /// \return the result of the enumeration (see `enumerator.h`)
    /// \throws QrComponentManagerEx::ExBadCast  if there is no component manager
    virtual QrEnum::Action enumerateObjects(QrEnumerator<QrCPtr<QrImportBuilder>>& e) const;

    /// Returns the filter text for a file dialog. It consists, for each builder, of the label, "|",
    /// the extensions as "*.a;*.b", and "|". An additional NUL precedes the terminator of the
    /// string. Without builders, the text consists of these two characters.
    ///
    /// The first call composes the text from the builders known then; later calls return the same
    /// text. It is valid until the importer is destroyed or assigned to.
    ///
    /// Threads: the first call must not run concurrently with another call on the same importer.
    ///
    /// \throws QrComponentManagerEx::ExBadCast  if there is no component manager
    virtual const wchar_t* getFileTypes() const;

    /// Returns the object that the file `path` describes, or null. The process controller searches
    /// `search`, then `getDefaultSearch()`.
    ///
    /// \throws QrComponentManagerEx::ExBadCast  if there is no process controller or no component
    ///         manager
    QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search,
                             bool& found) const override;
    QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search) const override;

    /// Returns the object that the data of `io` describes, or null.
    ///
    /// The first pass calls `canImport`, in order, of the builders that list the extension of
    /// `path` (the text after its last '.', compared case-sensitively). The second pass calls it of
    /// all builders. The first builder that returns true imports the data, and its result is final,
    /// even if it is null. The search also ends with null if `io` cannot report its position, or if
    /// `enumerateExtensions` of a builder returns `Fail`.
    ///
    /// Builders receive `path` as their `path`, and again as their `hint`. The `hint` is empty if
    /// `search` is null. `search` itself is not passed to them.
    ///
    /// \param io      input whose position can be queried and restored; must not be null
    /// \param path    name of the data; null omits the first pass
    /// \param search  search path or null; must be null if `path` is null
    /// \throws QrComponentManagerEx::ExBadCast  if `io` is null or there is no component manager
    virtual QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* search) const;

    /// Returns the directories to search after those of the caller, separated by ';', or null. The
    /// default is null.
    virtual const wchar_t* getDefaultSearch() const;

  private:
    mutable std::wstring fileTypes;
};

} // namespace Mz
