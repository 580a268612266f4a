/// The component manager, and what a component library gives to it.
///
/// For hosts: `QrGetComponentManager()` and `QrComponentManager`.
/// For component libraries: the entry point (at the end of this file), `QrComponentDescription`,
/// `QrBuilderDescription` and `QrComponentBuilder`. The component kit makes all three short; read
/// on here to know what it does, or to do it by hand.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/enumerator.h"
#include "components/componentManager/export.h"

namespace Mz {

/// A builder: makes objects of one kind, for whoever asks the manager for its identifier.
class MZ_COMPONENT_MANAGER_API QrComponentBuilder : public QrCastable {
  public:
    using Self = QrComponentBuilder;
    static constexpr QrUid uid{0xAD148681, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrComponentBuilder() override;

    /// The builder to work with: itself, with a new reference, unless it stands for another.
    virtual QrRefPtr<QrComponentBuilder> getBuilder();

    /// A new object of this builder's kind, or null when it cannot make one. The reference is the
    /// caller's; so is the duty to drop it before the manager, and with it the library, is gone.
    virtual QrRef<QrCastable> createObject() = 0;
};

/// What is known of a builder without using it.
///
/// A component library implements it once for each builder it describes; the manager copies what it
/// says into a record of its own, which implements it again, so that clients list and choose
/// builders without their libraries being loaded. What label, number, text and flag mean is agreed
/// between the libraries and their clients; the manager keeps them unread.
///
/// No text is ever null in a record, and each is valid until the manager is destroyed; only the two
/// texts of the component, which belong to all builders of a library, are replaced when the library
/// is read anew, at the first use of one whose file has changed since the start. A library's own
/// descriptions may give null for an empty text.
class MZ_COMPONENT_MANAGER_API QrBuilderDescription : public QrCastable {
  public:
    using Self = QrBuilderDescription;
    static constexpr QrUid uid{0xAD148680, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrBuilderDescription() override;

    /// The builder's identity, by which the manager finds it.
    virtual const QrUid& getUid() const = 0;
    /// The builder's name, by which importers find it; compared exactly.
    virtual const wchar_t* getName() const = 0;
    virtual const wchar_t* getLabel() const = 0;
    virtual unsigned int getNumber() const = 0;
    virtual const wchar_t* getText() const = 0;
    /// The label of the component library. Of a library that is recorded but was not loaded in this
    /// process, label and text are empty.
    virtual const wchar_t* getComponentLabel() const = 0;
    /// The text of the component library.
    virtual const wchar_t* getComponentText() const = 0;
    virtual bool getFlag() const = 0;

    /// The builder itself. A manager's record loads the library first, where needed, and gives null
    /// when that fails or the library does not make the builder; exceptions of the library's own
    /// code pass through.
    virtual QrRefPtr<QrComponentBuilder> getBuilder() = 0;
    virtual QrCRefPtr<QrComponentBuilder> getBuilder() const = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// What a component library says of itself: the interface of the object that its entry point
/// returns.
///
/// The manager calls it on whatever thread asked for a builder, in this order when it records the
/// library: `getComponentValue`, `getComponentText`, `getComponentLabel`, `getBuilderCount`,
/// `enumerateBuilders`, `release`. Whatever it throws there is caught: the library is then recorded
/// without builders and unloaded. When a client asks for a builder, what `createBuilder` or the
/// `release` of the description throws reaches that client.
class MZ_COMPONENT_MANAGER_API QrComponentDescription : public QrCastable {
  public:
    using Self = QrComponentDescription;
    static constexpr QrUid uid{0xAD148683, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrComponentDescription() override;

    /// The builder with the identifier `uid`, which answers for `QrComponentBuilder`; null when the
    /// library has none such. Called each time that a client asks, so a library that wants one
    /// builder for all keeps it.
    virtual QrRef<QrCastable> createBuilder(const QrUid& uid) = 0;

    /// A value that the manager stores without reading it.
    virtual int64 getComponentValue() = 0;
    /// A label for people; null counts as empty.
    virtual const wchar_t* getComponentLabel() = 0;
    /// A text for people; null counts as empty.
    virtual const wchar_t* getComponentText() = 0;

    /// How many builders `enumerateBuilders` offers. A hint, on which nothing depends.
    virtual unsigned int getBuilderCount() = 0;

    /// Offers a description of every builder, following the rules of `enumerator.h`. What is not a
    /// `QrBuilderDescription`, null included, makes the manager drop the whole library.
    virtual QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// The process-wide object through which builders are found.
///
/// Threads: initialise it once, from one thread, before others use it. After that the operations
/// may run side by side for builders whose libraries are loaded; the first use of a builder loads
/// its library and must not overlap any other use of the manager.
///
/// The manager is destroyed when this library is unloaded, at the end of the process as a rule, and
/// takes the libraries that it loaded with it: objects, builders and descriptions must be given
/// back before. Once it has loaded a component library, this library stays until the process ends,
/// even if the host unloads it.
class MZ_COMPONENT_MANAGER_API QrComponentManager : public QrCastable {
  public:
    using Self = QrComponentManager;
    static constexpr QrUid uid{0xAD148684, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrComponentManager() override;

    /// The builder registered for `uid`, its library loaded if need be; null before `initialize`,
    /// for an unknown identifier, and when the library no longer gives it.
    virtual QrRefPtr<QrComponentBuilder> getBuilder(const QrUid& uid) = 0;

    /// Offers every builder known, library by library in the order of the search path, and returns
    /// what ended the walk. Before `initialize` there is none. Loads nothing.
    virtual QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) = 0;

    /// Looks through the directories of `searchPath` (separated by ';') for component libraries and
    /// records the builders that each describes. Null, or nothing but ';', means the directory of
    /// the executable. Works once; every later call, also one from within, does nothing.
    ///
    /// Every regular file of a directory that is neither hidden nor a system file is looked at,
    /// whatever its extension; sub-directories are not. A file that is no component library, that
    /// cannot be loaded or that fails while it describes itself is passed over without a word. A
    /// library without the entry point is never mapped, only read; so are programs and damaged
    /// files. A file that cannot be opened for want of resources is passed over and not recorded,
    /// so that the next start looks at it again.
    ///
    /// The files of a directory come in the order in which NTFS lists them, on every system. Of two
    /// builders with one identifier the one that comes later is found.
    ///
    /// A search path is normalised before use: lower case, '\' between names, and runs of
    /// separators as one. "." and ".." are *not* resolved (`a/b/../c` becomes `a\b\c`), so give
    /// full paths without them: on Windows the normalised path is what is opened.
    virtual void initialize(const wchar_t* searchPath) = 0;

    /// A new object made by the builder registered for `uid`, or null where there is no builder or
    /// it makes none.
    virtual QrRef<QrCastable> createObject(const QrUid& uid) = 0;
};

} // namespace Mz

extern "C" {

/// The manager of this process. Never null, takes no reference, may be called at any time.
MZ_COMPONENT_MANAGER_API Mz::QrComponentManager* QrGetComponentManager();

/// The name under which a component library exports its entry point, a plain function without
/// arguments:
///
///     extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription();
///
/// **What it returns.** An object that answers for `QrComponentDescription`. The manager takes a
/// reference of its own on it and gives that back when it is done, so the function may return a
/// static object that does not count, or a new counted object without any reference. Null, an
/// object without that interface or an exception make the manager drop the library.
///
/// **When it is called.** By the host's process, on the thread that initialises the manager or asks
/// for a builder: once when the library is recorded, and again for each request for one of its
/// builders. It must therefore be quick, and must always describe the same builders. A library
/// whose file has not changed since it was recorded is not called until a builder is wanted.
///
/// **What runs before it.** The initialisers of the library and of those that it needs, and nothing
/// else. Before that, the file has only been read: a library that does not export this very name
/// itself (not merely through one it depends on) is never loaded at all. Initialisers must neither
/// throw nor end their thread. On Linux both call `std::terminate`, whatever the host catches: an
/// exception that passed the loader would leave it locked. The same holds while the library is
/// unloaded.
///
/// **How long the library stays.** One that describes no builders because it failed is unloaded at
/// once. Otherwise it stays loaded until the manager is destroyed, so builders and objects may use
/// its code and its statics throughout.
///
/// **What it must not do.** Call `initialize`, keep the enumerator it is given, or rely on another
/// component library being there already: libraries are recorded in the order of their names, and
/// another process may record yours alone.
using QrGetComponentDescriptionFunction = Mz::QrCastable*();
}

namespace Mz {
using ::QrGetComponentManager;
} // namespace Mz
