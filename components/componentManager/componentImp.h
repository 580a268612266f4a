// SPDX-License-Identifier: BSL-1.0
/// The component manager, and the interfaces of a component library.
///
/// For hosts: `QrGetComponentManager()` and `QrComponentManager`.
/// For component libraries: the entry point (`QrGetComponentDescriptionFunction`, at the end of
/// this file), `QrComponentDescription`, `QrBuilderDescription` and `QrComponentBuilder`. The
/// component kit implements all of them in a few lines. Read on here to know what it does, or to
/// implement them by hand.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/enumerator.h"
#include "components/componentManager/export.h"

namespace Mz {

/// A builder: makes objects of one kind. The component manager finds it by its uid.
class MZ_COMPONENT_MANAGER_API QrComponentBuilder : public QrCastable {
  public:
    using Self = QrComponentBuilder;
    static constexpr QrUid uid{0xAD148681, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrComponentBuilder() override;

    /// Returns the builder to use. The default returns this builder; one that represents another
    /// builder returns that one.
    ///
    /// The caller owns the reference.
    virtual QrRefPtr<QrComponentBuilder> getBuilder();

    /// Returns a new object of this builder's kind.
    ///
    /// The caller owns the reference. Release it before the manager is destroyed: that unloads the
    /// object's code.
    ///
    /// \return the object, or null if the builder cannot make one
    virtual QrRef<QrCastable> createObject() = 0;
};

/// The description of one builder, which is available without the builder itself.
///
/// A component library implements this interface once for each of its builders. The manager copies
/// the values into a builder record, which implements the interface again. Clients list and choose
/// builders by these records, without loading any library. The libraries and their clients agree on
/// the meaning of label, number, text and flag; the manager does not interpret them.
///
/// A record never returns a null text. A library's own description may return null for an empty
/// text.
///
/// The texts of a record are valid until the manager is destroyed, with one exception: the two
/// texts of the component. All builders of a library share them, and the manager replaces them when
/// it records the library anew. That happens at the first use of a library whose file has changed
/// since the manager was initialised.
class MZ_COMPONENT_MANAGER_API QrBuilderDescription : public QrCastable {
  public:
    using Self = QrBuilderDescription;
    static constexpr QrUid uid{0xAD148680, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrBuilderDescription() override;

    /// Returns the builder's identity, by which the manager finds it.
    virtual const QrUid& getUid() const = 0;
    /// Returns the builder's name, by which importers find it. They compare it exactly, including
    /// letter case.
    virtual const wchar_t* getName() const = 0;
    /// Returns the builder's label.
    virtual const wchar_t* getLabel() const = 0;
    /// Returns the builder's number.
    virtual unsigned int getNumber() const = 0;
    /// Returns the builder's text.
    virtual const wchar_t* getText() const = 0;
    /// Returns the label of the component library.
    ///
    /// Recorded lists do not contain label and text of a library. Both are empty for a library that
    /// was restored from such a list, and stay empty when the library is loaded, until it is
    /// recorded anew because its file has changed.
    virtual const wchar_t* getComponentLabel() const = 0;
    /// Returns the text of the component library, which is empty when the label is not available.
    virtual const wchar_t* getComponentText() const = 0;
    /// Returns the builder's flag.
    virtual bool getFlag() const = 0;

    /// Returns the builder itself. A record of the manager loads the library first, if necessary.
    ///
    /// The caller owns the reference.
    ///
    /// \return the builder; a record returns null if the library cannot be loaded or does not make
    ///     the builder
    /// \throws whatever the library's own code throws
    virtual QrRefPtr<QrComponentBuilder> getBuilder() = 0;
    virtual QrCRefPtr<QrComponentBuilder> getBuilder() const = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// The description of a component library: the object that its entry point returns.
///
/// To record a library, the manager calls, in this order: `getComponentValue`, `getComponentText`,
/// `getComponentLabel`, `getBuilderCount`, `enumerateBuilders`, `release`. It catches whatever they
/// throw, drops the builders of the library and unloads it. The next start tries the library again.
///
/// When a client asks for a builder, the manager calls `createBuilder` and `release`. Their
/// exceptions propagate to that client.
///
/// All calls run on the thread that initialises the manager or asks for a builder.
class MZ_COMPONENT_MANAGER_API QrComponentDescription : public QrCastable {
  public:
    using Self = QrComponentDescription;
    static constexpr QrUid uid{0xAD148683, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrComponentDescription() override;

    /// Returns the builder with the identity `uid`.
    ///
    /// The manager calls this for each request of a client. A library that has one builder for all
    /// clients keeps it and returns it each time.
    ///
    /// The caller owns the reference.
    ///
    /// \return an object that casts to `QrComponentBuilder`, or null if the library has no such
    ///     builder
    virtual QrRef<QrCastable> createBuilder(const QrUid& uid) = 0;

    /// Returns a value that the manager stores and does not interpret.
    virtual int64 getComponentValue() = 0;
    /// Returns the library's label, for people. Null means empty.
    virtual const wchar_t* getComponentLabel() = 0;
    /// Returns a text about the library, for people. Null means empty.
    virtual const wchar_t* getComponentText() = 0;

    /// Returns the number of builders that `enumerateBuilders` passes. This is a hint: the manager
    /// works with a wrong number, too.
    virtual unsigned int getBuilderCount() = 0;

    /// Passes the description of each builder to `e`, by the rules of `enumerator.h`.
    ///
    /// If an element is null or does not cast to `QrBuilderDescription`, the manager's enumerator
    /// throws, and the manager drops all builders of the library.
    ///
    /// \param e  the enumerator; it must not be used after the call
    /// \return the action that ended the enumeration
    virtual QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) = 0;

  private:
    virtual void forceVtblInstantiation();
};

/// The component manager: the process-wide object that finds builders and makes objects.
///
///     Mz::QrGetComponentManager()->initialize(searchPath);
///     const Mz::QrRef<Mz::QrCastable> object =
///         Mz::QrGetComponentManager()->createObject(builderUid); // may be null
///
/// **Threads.** Initialise the manager once, from one thread, before other threads use it. After
/// that its operations may run concurrently for builders whose libraries are loaded. The first use
/// of a builder loads its library and must not run concurrently with any other use of the manager.
///
/// **Lifetime.** The manager is destroyed when this library is unloaded, usually at the end of the
/// process, and unloads the libraries that it loaded. Release all objects, builders and
/// descriptions before that. Once the manager has loaded a component library, this library stays
/// loaded until the process ends, even if the host unloads it.
class MZ_COMPONENT_MANAGER_API QrComponentManager : public QrCastable {
  public:
    using Self = QrComponentManager;
    static constexpr QrUid uid{0xAD148684, 0x719A11D1, 0xA3BB0060, 0x9707609D};

    ~QrComponentManager() override;

    /// Returns the builder that is registered for `uid`. Loads its library, if necessary.
    ///
    /// The caller owns the reference.
    ///
    /// \return the builder; null before `initialize`, if `uid` is unknown, if the library cannot be
    ///     loaded, or if the library does not make the builder
    /// \throws whatever the library's own code throws
    virtual QrRefPtr<QrComponentBuilder> getBuilder(const QrUid& uid) = 0;

    /// Passes each builder record to `e`, library by library in the order of the search path. Loads
    /// no library. Before `initialize` there are no records.
    ///
    /// \return the action that ended the enumeration
    /// \throws whatever `e` throws
    virtual QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) = 0;

    /// Searches directories for component libraries and registers the builders that they describe.
    ///
    /// Works once. Calls after a successful one, and calls from code that runs during one, are
    /// no-ops.
    ///
    /// **Candidates.** All regular files of a directory that are neither hidden nor system files,
    /// whatever their extension. Sub-directories are not searched. A file is skipped silently if it
    /// is not a component library, if it cannot be loaded, or if it fails to describe itself.
    /// Programs, damaged files and libraries without the entry point are only read, never mapped.
    /// If the system lacks the resources to open a file, the file is skipped and not recorded, so
    /// that the next start tries it again.
    ///
    /// **Order.** The files of a directory are in the order in which NTFS lists them, on every
    /// system. If several libraries describe a builder with the same uid, the last one is
    /// registered. One library must not describe two builders with the same uid: the last one is
    /// registered if the library is loaded, the first one if its record is restored.
    ///
    /// **Normalisation.** The search path is normalised before use: lower case, '\' between names,
    /// one separator for each run of separators. "." and ".." are *not* resolved (`a/b/../c`
    /// becomes `a\b\c`), and on Windows the normalised path is opened. Therefore pass full paths
    /// without them; `fullPath` (`files.h`) returns such a path.
    ///
    /// \param searchPath  the directories, separated by ';'. Null, or nothing but ';', means the
    ///     directory of the executable as the command line names it. If the program was started by
    ///     its bare name, that is the current directory; `programFolder` (`files.h`) always returns
    ///     the executable's own.
    /// \throws std::bad_alloc if memory runs out. Another call then starts again.
    virtual void initialize(const wchar_t* searchPath) = 0;

    /// Returns a new object, made by the builder that is registered for `uid`. Loads its library,
    /// if necessary.
    ///
    /// The caller owns the reference. Release it before the manager is destroyed.
    ///
    /// \return the object; null if `getBuilder` returns null or the builder makes no object
    /// \throws whatever the library's own code throws
    virtual QrRef<QrCastable> createObject(const QrUid& uid) = 0;
};

} // namespace Mz

extern "C" {

/// Returns the component manager of this process.
///
/// Never returns null, and takes no reference for the caller. May be called at any time, from any
/// thread.
MZ_COMPONENT_MANAGER_API Mz::QrComponentManager* QrGetComponentManager();

/// The type of the entry point: the function that each component library exports under the name
/// `QrGetComponentDescription`.
///
///     extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription();
///
/// **Result.** The entry point returns an object that casts to `QrComponentDescription`. The
/// manager takes its own reference and releases it after use. The function may therefore return a
/// static object without a reference count, or a new counted object whose count is zero.
///
/// **Failure.** If the result is null or does not cast, or if the function throws, the library is
/// unloaded and has no builders. After an exception the next start tries it again, otherwise not
/// until the file changes. If it fails only when a client asks for a builder, the library stays
/// loaded, and the client gets null or the exception.
///
/// **Calls.** The manager calls the entry point in the host's process, on the thread that
/// initialises the manager or asks for a builder: once to record the library, and again for each
/// request for one of its builders. The function must be quick and must always describe the same
/// builders. For a library whose file has not changed since it was recorded, the first call is at
/// the first request for a builder.
///
/// **Code that runs before.** Only the initialisers of the library and of its dependencies. Before
/// they run, the manager has checked the file without running any of its code. A library is never
/// loaded unless it exports this very name itself; an export of one of its dependencies does not
/// count.
///
/// **Initialisers and finalisers.** They must neither throw nor end their thread. On Linux
/// either one calls `std::terminate`, whatever the host catches, because an exception that passes
/// the loader leaves the loader locked.
///
/// **Lifetime of the library.** A library that fails to describe itself is unloaded at once. Any
/// other library stays loaded until the manager is destroyed. Its builders and objects may use its
/// code and its static objects until then. The manager never unloads a library that the process had
/// mapped before.
///
/// **Forbidden.** The entry point and the description must not call `initialize`, must not use the
/// enumerator after `enumerateBuilders` has returned, and must not rely on another component
/// library being loaded. Libraries are recorded in the order of their names, and another process
/// may record a library alone.
using QrGetComponentDescriptionFunction = Mz::QrCastable*();
}

namespace Mz {
using ::QrGetComponentManager;
} // namespace Mz
