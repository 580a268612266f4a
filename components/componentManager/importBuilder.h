/// Builders that turn a foreign file into an object.
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/enumerator.h"
#include "components/componentManager/export.h"

namespace Mz {

/// A builder that can read one kind of foreign file.
///
/// It is a component builder like any other, registered under its importer's builder name, that
/// answers this interface too. Its object therefore answers for `QrComponentBuilder`,
/// `QrImportBuilder` and `QrBuilderDescription`; `QrCastMulti` makes such objects, and the
/// component kit makes them short.
///
/// In every operation, `path` is the file's name as the caller gave it, which need not be the name
/// under which the file was found, and `hint` is a second text that this library passes on unread.
///
/// A class that overrides one form of `canImport` or `import` hides the other; it says
/// `using QrImportBuilder::canImport; using QrImportBuilder::import;`.
class MZ_COMPONENT_MANAGER_API QrImportBuilder : public QrCastable {
  public:
    using Self = QrImportBuilder;
    static constexpr QrUid uid{0xAD148682, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrImportBuilder() override;

    /// Offers every file extension that this builder reads, without dot or wildcard ("obj"), and
    /// returns the enumeration's result.
    virtual QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const = 0;

    /// Whether this builder can import the data of `io`, which stands where the data begins. It may
    /// read as it likes; the caller restores the position.
    virtual bool canImport(QrPtr<QrBufferedIO> io, const wchar_t* path,
                           const wchar_t* hint) const = 0;

    /// The same for a file, which is opened for the call, with nothing denied to other openers. A
    /// null or empty `path` or a file that cannot be opened gives false. Exceptions of the other
    /// form pass through, the file closed.
    virtual bool canImport(const wchar_t* path, const wchar_t* hint) const;

    /// Reads the data of `io` and returns the object made of it, or null when it cannot: a builder
    /// tells why through the process controller. The object must not keep `io`.
    virtual QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* hint) const = 0;

    /// The same for a file, with null where `canImport` gives false. The file is closed before the
    /// result is returned.
    virtual QrRef<QrCastable> import(const wchar_t* path, const wchar_t* hint) const;
};

} // namespace Mz
