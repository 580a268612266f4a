/// Importing a file through whichever builder can read it.
#pragma once

#include "components/componentManager/export.h"
#include "components/componentManager/importBuilder.h"

#include <string>

namespace Mz {

/// One kind of import: a family of foreign file formats, read by the import builders that are
/// registered under one builder name.
class MZ_COMPONENT_MANAGER_API QrImporter : public QrCastable {
  public:
    using Self = QrImporter;
    static constexpr QrUid uid{0xAD148685, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrImporter() override;

    /// The name that the family's builders carry, compared with `QrBuilderDescription::getName()`
    /// exactly. Never null, and valid as long as the importer.
    virtual const wchar_t* getBuilderName() const = 0;

    /// Imports the file `path`, looked for along `search` (directories separated by ';', or null).
    /// `found` tells a file that does not exist (false) from one that nobody could read (true, with
    /// a null result). This base sets it to true and leaves all else to the other form.
    virtual QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search, bool& found) const;

    /// The same for callers who need not know.
    virtual QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search) const = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// The importer that does it all, but for the builder name: a concrete importer derives from it in
/// a component library and supplies that name.
///
/// Builders are those of the process's component manager at the time of the call, in its order. The
/// file is looked for by the calling thread's process controller. Every operation throws
/// `QrComponentManagerEx::ExBadCast` when one of the two is missing, and lets the exceptions of
/// builders and buffers through, with the file closed.
class MZ_COMPONENT_MANAGER_API QrBaseImporter : public QrImporter {
  public:
    QrBaseImporter();
    QrBaseImporter(const QrBaseImporter& other);
    QrBaseImporter& operator=(const QrBaseImporter& other);
    ~QrBaseImporter() override;

    using QrImporter::import;

    /// Offers every import builder of this importer to `e`, loading their libraries as needed.
    virtual QrEnum::Action enumerateObjects(QrEnumerator<QrCPtr<QrImportBuilder>>& e) const;

    /// The text for a file dialog's filter: for each builder its label, "|", its extensions as
    /// "*.a;*.b", "|"; at the end a NUL beside the string's own. With no builder only those two.
    ///
    /// It is made once for each importer object, from the builders known then, and valid for the
    /// importer's life. The first call must not meet another one on the same importer.
    virtual const wchar_t* getFileTypes() const;

    /// Finds the file along `search`, then along `getDefaultSearch()`, and imports it.
    QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search,
                             bool& found) const override;
    QrRef<QrCastable> import(const wchar_t* path, const wchar_t* search) const override;

    /// Imports the data of `io`, which must be able to tell and restore its position.
    ///
    /// First the builders that list the extension of `path` (all after its last '.', compared
    /// exactly) are asked in order whether they can import the data, then all of them; the first
    /// that says yes decides, be its object null. A null `path` skips the first round; with a null
    /// `path`, `search` must be null too.
    ///
    /// Builders are given `path` as both their texts; the second one is empty when `search` is
    /// null. `search` itself does not reach them.
    virtual QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* search) const;

    /// Directories, separated by ';', that are searched after the caller's; null for none.
    virtual const wchar_t* getDefaultSearch() const;

  private:
    mutable std::wstring fileTypes;
};

} // namespace Mz
