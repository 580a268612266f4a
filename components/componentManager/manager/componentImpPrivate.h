// SPDX-License-Identifier: BSL-1.0
/// The private classes of the component manager. Exported for the tests only.
///
/// The sources: `componentImp.cpp` (the interfaces and the manager's operations),
/// `componentImpRegistry.cpp` (builder records), `componentImpDiscovery.cpp` (search path and
/// merge), `componentImpLoading.cpp` (loading and recording one library), and
/// `componentImpPersistence.cpp` (the recorded list). `sharedText.h` and `recordList.h` keep the
/// texts and builder records of many libraries in little memory.
#pragma once

#include "components/componentManager/componentImp.h"
#include "components/componentManager/manager/recordList.h"
#include "components/componentManager/manager/sharedText.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/support/internalExport.h"
#include "components/platform/platform.h"

#include <list>
#include <string>
#include <vector>

namespace Mz {

struct ComponentLibrary;
class ComponentManagerPersistant;

struct UidHash {
    std::uint32_t operator()(const QrUid& uid) const { return uid.w0; }
};

/// The implementation of the component manager. `QrGetComponentManager` returns the one of the
/// process; tests create others.
class MZ_INTERNAL_API ComponentManager final
    : public QrCastImpl2<ComponentManager, QrComponentManager,
                         QrTempIface<ComponentManager, ComponentManagerPersistant>,
                         const ComponentManager&> {
  public:
    class Builder;
    using BuilderList = RecordList<Builder>;

    /// The directory and the file name of a library record. Views into that record.
    using LibraryKey = std::pair<std::wstring_view, std::wstring_view>;
    struct MZ_INTERNAL_API LibraryKeyHash {
        std::size_t operator()(const LibraryKey& key) const;
    };
    using LibraryList = std::list<ComponentLibrary>;
    using LibraryMap = HashMap<LibraryKey, LibraryList::iterator, LibraryKeyHash>;

    ComponentManager();
    ~ComponentManager() override;
    ComponentManager(const ComponentManager&) = delete;
    ComponentManager& operator=(const ComponentManager&) = delete;

    QrRefPtr<QrComponentBuilder> getBuilder(const QrUid& uid) override;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override;
    void initialize(const wchar_t* searchPath) override;
    QrRef<QrCastable> createObject(const QrUid& uid) override;

    /// Returns `path` in the form in which directory and file names are stored and compared. In
    /// list mode, `path` is a list separated by ';'. Returns an empty string for null.
    static std::wstring normalisePath(const wchar_t* path, bool listMode);

    /// Appends a record to `newList` for each candidate in the directories of `searchPath`, and
    /// enters it in `byName` unless another record has the same names. Appends to `unlisted` the
    /// normalised directories of which the system could not list all files.
    void discover(const wchar_t* searchPath, LibraryList& newList, LibraryMap& byName,
                  std::vector<std::wstring>& unlisted);

    /// Replaces each new record in `found` by the restored record of the same file, if there is
    /// one, with its time, size and builders. The other restored records stay in `libraries`, and
    /// all of them do if it throws. List nodes are spliced; no record is copied or moved in memory.
    void merge(LibraryList& found, LibraryMap& byName);

    /// Moves the restored records of these directories from `libraries` to `found`. Their files may
    /// exist nevertheless, and a record without builders keeps its library from being loaded.
    void keepUnlisted(LibraryList& found, const std::vector<std::wstring>& unlisted);

    /// Registers the builders of the library and, if `forUse`, loads it. Without `forUse`, a
    /// library whose file has not changed since it was recorded is not loaded. Returns false if the
    /// library was recorded without builders, cannot be loaded, or fails to describe itself.
    bool ensureLoaded(ComponentLibrary& library, bool forUse);

    /// Calls the entry point and returns the description; null if the library cannot be loaded, has
    /// no entry point, or returns no description. Throws what the code of the library throws.
    QrPtr<QrComponentDescription> getDescription(ComponentLibrary& library);

    /// Returns the builder with this uid, or null. Loads the library, if necessary. Throws what the
    /// code of the library throws.
    QrRefPtr<QrComponentBuilder> getComponentBuilder(ComponentLibrary& library, const QrUid& uid);

    /// Unloads the library if the manager loaded it. No exception object of its code may be alive.
    void unload(ComponentLibrary& library);

    /// Writes the library records with their builder records. Writes nothing before `initialize`.
    void writeRecords(QrStream& stream);

    /// Appends library records, which `initialize` merges with the files that it finds. A no-op
    /// once `initialize` has begun. After a failure the records that were read completely stay. The
    /// incomplete one loses its time, size and builders, so that `initialize` records its file
    /// anew.
    void readRecords(QrStream& stream);

    /// Enters the builders of the library in the index, replacing entries of the same uid. If two
    /// builders of the library have the same uid, the first one wins.
    void reindexBuilders(ComponentLibrary& library);

    /// Removes the builder records from the library, and their uids from the index, even where the
    /// entry refers to a builder of another library. The records stay valid, because clients may
    /// still hold pointers to them. If it throws, nothing has changed.
    void dropBuilders(ComponentLibrary& library);

    NodePool<Builder> builderPool; ///< destroyed after all records
    LibraryList libraries;
    HashMap<QrUid, Builder*, UidHash> builderIndex;
    bool initialised = false;

  private:
    enum class LoadResult {
        loaded,
        rejected, ///< the file is not a component library, or cannot be loaded
        unknown,  ///< the system lacked resources, or could not read the file now
    };
    /// Does what `ensureLoaded` promises, for a library that is not loaded.
    bool loadIfNeeded(ComponentLibrary& library, bool forUse);
    /// Uses the library that is mapped in the process already, or else loads it.
    LoadResult loadModule(ComponentLibrary& library);
    /// Records the builders that the loaded library describes. On failure, drops them and unloads
    /// the library. Returns whether the library has a description.
    bool registerLibrary(ComponentLibrary& library, const platform::FileStatus& status);
    /// Does the same without an allocation.
    /// \param place  one empty list for the builders, which is taken over
    void dropBuilders(ComponentLibrary& library, std::list<BuilderList>& place);
    /// Copies the values and builders of the description into the library record.
    void readDescription(ComponentLibrary& library, QrComponentDescription& description);

    /// True while `initialize` runs, so that a nested call is a no-op.
    bool initialising = false;

    /// Dropped records, to which clients may still hold pointers.
    std::list<BuilderList> droppedBuilders;
};

/// A builder record: the manager's copy of a builder description.
class MZ_INTERNAL_API ComponentManager::Builder final
    : public QrCastImpl<ComponentManager::Builder, QrBuilderDescription,
                        const ComponentManager::Builder&> {
  public:
    Builder();
    Builder(const Builder& other);
    Builder& operator=(const Builder& other);
    ~Builder() override;

    const QrUid& getUid() const override;
    const wchar_t* getName() const override;
    const wchar_t* getLabel() const override;
    unsigned int getNumber() const override;
    const wchar_t* getText() const override;
    const wchar_t* getComponentLabel() const override;
    const wchar_t* getComponentText() const override;
    bool getFlag() const override;
    QrRefPtr<QrComponentBuilder> getBuilder() override;
    QrCRefPtr<QrComponentBuilder> getBuilder() const override;

    ComponentLibrary* library = nullptr;
    QrUid uid{};
    SharedText name;
    SharedText label;
    SharedText text;
    unsigned int number = 0;
    bool flag = false;
};

/// A library record: what the manager knows of one candidate.
struct MZ_INTERNAL_API ComponentLibrary {
    explicit ComponentLibrary(ComponentManager& manager);
    /// Unloads the library if the manager loaded it.
    ~ComponentLibrary();
    ComponentLibrary(const ComponentLibrary&) = delete;
    ComponentLibrary& operator=(const ComponentLibrary&) = delete;

    /// Returns the path by which the file is opened.
    platform::NativePath openingPath() const;

    /// Stores the file's time and size, for which the builder records are valid.
    void noteFile(const platform::FileStatus& status);

    SharedText directory; ///< normalised
    SharedText fileName;  ///< normalised
    platform::Module module = nullptr;
    std::uint32_t fileTime = 0; ///< when the builders were last read
    int64 fileSize = 0;         ///< when the builders were last read
    int64 descriptionValue = 0; ///< not interpreted
    SharedText componentText1;  ///< the label
    SharedText componentText2;  ///< the text
    ComponentManager::BuilderList builders;
    bool loadedByManager = false; ///< false if the process had mapped the module before

    ComponentManager* manager;
    std::size_t restoredCount = 0;  ///< in a new record: how many restored ones have its names
    platform::NativePath foundPath; ///< as the search path and the system spell it; never stored
    /// The address of the entry point, cached while the library is loaded. The function is still
    /// called each time.
    QrGetComponentDescriptionFunction* entryPoint = nullptr;
};

inline bool ComponentManager::ensureLoaded(ComponentLibrary& library, bool forUse) {
    return library.module ? !library.builders.empty() : loadIfNeeded(library, forUse);
}

/// The persistent companion of the manager: writes and reads the recorded list, so that the next
/// start loads only libraries that are new or have changed.
class MZ_INTERNAL_API ComponentManagerPersistant final
    : public QrTempObject<ComponentManager,
                          QrCastRef<QrCastHeap<QrCastImpl<ComponentManagerPersistant, QrPersistant,
                                                          const ComponentManagerPersistant&>>>> {
  public:
    explicit ComponentManagerPersistant(ComponentManager* manager);
    ~ComponentManagerPersistant() override;

    const QrUid* getClassUid() const override;
    unsigned int getVersion() const override;
    void write(QrStream& stream) override;
    void read(QrStream& stream) override;
};

} // namespace Mz
