/// The component manager's own classes. Not for clients: exported for the tests alone.
///
/// The sources around it, one thought each: `componentImp.cpp` (the interfaces and the manager's
/// operations), `componentImpRegistry.cpp` (builder records), `componentImpDiscovery.cpp` (search
/// path and merge), `componentImpLoading.cpp` (one library's loading and description),
/// `componentImpPersistence.cpp` (the recorded list).
#pragma once

#include "components/componentManager/componentImp.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/support/internalExport.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <list>
#include <memory>
#include <string>
#include <vector>

namespace Mz {

struct ComponentLibrary;
class ComponentManagerPersistant;

struct UidHash {
    std::uint32_t operator()(const QrUid& uid) const { return uid.w0; }
};

/// The manager. There is one for the process, which `QrGetComponentManager` gives out; tests make
/// others.
class MZ_INTERNAL_API ComponentManager final
    : public QrCastImpl2<ComponentManager, QrComponentManager,
                         QrTempIface<ComponentManager, ComponentManagerPersistant>,
                         const ComponentManager&> {
  public:
    class Builder;
    class BuilderList;

    /// Directory and file name of a library, as they stand in its record.
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

    /// The one form in which directory and file names are stored and compared. In list mode, `path`
    /// is a list separated by ';'. Null gives an empty string.
    static std::wstring normalisePath(const wchar_t* path, bool listMode);

    /// Appends a record to `newList` for every candidate file along `searchPath`, and enters it in
    /// `byName` unless another one has its names.
    void discover(const wchar_t* searchPath, LibraryList& newList, LibraryMap& byName);

    /// Puts each recorded library whose file was found again in the place of the new record, with
    /// all that is known of it. The nodes move, no record does.
    void merge(LibraryList& recorded, LibraryMap& byName);

    /// Makes the library's builders known, and when it is `forUse` has it loaded; false when it has
    /// no builders. A library whose file is as recorded is not loaded unless it is for use.
    bool ensureLoaded(ComponentLibrary& library, bool forUse);

    /// What the library says of itself; null when it is not loaded or has nothing to say.
    QrPtr<QrComponentDescription> getDescription(ComponentLibrary& library);

    /// The builder of the library with this identifier, the library loaded if need be, or null.
    QrRefPtr<QrComponentBuilder> getComponentBuilder(ComponentLibrary& library, const QrUid& uid);

    /// Gives the library back to the system if the manager loaded it. No exception made by its code
    /// may be alive.
    void unload(ComponentLibrary& library);

    /// Writes the recorded libraries and their builders; nothing before `initialize`.
    void writeRecords(QrStream& stream);

    /// Appends recorded libraries to those that `initialize` will compare with what it finds. Does
    /// nothing once that has begun. After a failure the libraries read whole stay, and the one that
    /// was being read is left such that it is read afresh from its file.
    void readRecords(QrStream& stream);

    /// Enters the library's builders in the index; of two with one identifier the first one stays.
    void reindexBuilders(ComponentLibrary& library);

    /// Takes the library's builders out of the index, by identifier alone, whoever's builder stands
    /// there, and out of the library. The records stay readable for those who still look at them.
    void dropBuilders(ComponentLibrary& library);

    LibraryList libraries;
    HashMap<QrUid, Builder*, UidHash> builderIndex;
    bool initialised = false;

  private:
    enum class LoadResult {
        loaded,
        rejected, ///< the file is no component library, or cannot be loaded
        unknown,  ///< the system had no resources left to look into the file
    };
    /// Finds the library in the process or loads it.
    LoadResult loadModule(ComponentLibrary& library);
    /// Has the loaded library describe itself. One that fails is left without builders and
    /// unloaded.
    bool registerLibrary(ComponentLibrary& library, const platform::FileStatus& status);
    void readDescription(ComponentLibrary& library, QrComponentDescription& description);

    /// While `initialize` runs, so that a library that calls it does nothing.
    bool initialising = false;

    /// Records that were dropped while somebody may still look at them.
    std::list<BuilderList> droppedBuilders;
};

/// What the manager knows of one builder: a copy of what the library's description said.
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
    std::wstring name;
    std::wstring label;
    std::wstring text;
    unsigned int number = 0;
    bool flag = false;
};

/// The builders of one library, by number. Grows without moving a record: clients and the index
/// point at them.
class ComponentManager::BuilderList {
  public:
    bool empty() const { return records.empty(); }
    std::size_t size() const { return records.size(); }
    Builder& operator[](std::size_t index) { return *records[index]; }
    const Builder& operator[](std::size_t index) const { return *records[index]; }
    Builder& front() { return *records.front(); }
    const Builder& front() const { return *records.front(); }
    Builder& emplace_back(const Builder& record = Builder()) {
        return *records.emplace_back(std::make_unique<Builder>(record));
    }
    void reverse() { std::reverse(records.begin(), records.end()); }
    void clear() { records.clear(); }
    void swap(BuilderList& other) { records.swap(other.records); }

  private:
    std::vector<std::unique_ptr<Builder>> records;
};

/// What the manager knows of one candidate file.
struct MZ_INTERNAL_API ComponentLibrary {
    explicit ComponentLibrary(ComponentManager& manager);
    /// Gives the library back to the system if the manager loaded it.
    ~ComponentLibrary();
    ComponentLibrary(const ComponentLibrary&) = delete;
    ComponentLibrary& operator=(const ComponentLibrary&) = delete;

    /// The name under which the file is opened.
    platform::NativePath openingPath() const;

    /// Remembers that the builders are those of this state of the file.
    void noteFile(const platform::FileStatus& status);

    std::wstring directory; ///< normalised
    std::wstring fileName;  ///< normalised
    platform::Module module = nullptr;
    std::uint32_t fileTime = 0; ///< as it was when the builders were last read
    int64 fileSize = 0;         ///< likewise
    int64 descriptionValue = 0;
    std::wstring componentText1; ///< the label
    std::wstring componentText2; ///< the text
    ComponentManager::BuilderList builders;
    bool loadedByManager = false;

    ComponentManager* manager;
    std::size_t claims =
        0; ///< of a file that was found: how many recorded libraries have its names
    platform::NativePath foundPath; ///< as the search path and the system spell it; never stored
    /// The entry point's address while the library is loaded. Only the look-up is spared: the call
    /// is made each time.
    QrGetComponentDescriptionFunction* entryPoint = nullptr;
};

/// Stores the manager's records, so that the next start need not load what has not changed.
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
