/// Objects that are stored, and the second pass after a load.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/export.h"

#include <memory>

namespace Mz {

class QrStream;

/// The interface of objects that write themselves to a stream and read themselves back.
///
/// An object that needs others to be complete before it can resolve its links to them asks for a
/// second pass: while it is being read it calls `QrStream::postLoad(this)`, and is told
/// `loadFinished` when the whole load is over.
class MZ_COMPONENT_MANAGER_API QrPersistant : public QrCastable {
  public:
    using Self = QrPersistant;
    static constexpr QrUid uid{0x81C8DF24, 0xA78111D1, 0x988A4445, 0x53540000};

    ~QrPersistant() override;

    /// The identity of the object's class, not of this interface. Never null, valid for good.
    virtual const QrUid* getClassUid() const = 0;
    /// The version of the stored form, by which `read` and its users tell old data from new.
    virtual unsigned int getVersion() const = 0;
    /// Stores the object. What the stream throws passes through.
    virtual void write(QrStream& stream) = 0;
    /// Restores the object from what `write` stored. What the stream throws passes through.
    virtual void read(QrStream& stream) = 0;

    /// The whole load is over; the default does nothing.
    virtual void loadFinished();

  private:
    virtual void forceVtblInstantiation();
};

/// The objects that want to be told when a load is over, in order.
///
/// Holds one reference for each entry; an object that was appended twice is told twice. Used by one
/// thread at a time.
class MZ_COMPONENT_MANAGER_API QrPostLoadList {
  public:
    QrPostLoadList();
    /// Drops what is left, without telling anybody.
    ~QrPostLoadList();
    QrPostLoadList(const QrPostLoadList&) = delete;
    QrPostLoadList& operator=(const QrPostLoadList&) = delete;

    /// Appends `obj`, with a new reference: behind the entry that was appended last, wherever that
    /// stands now, or at the end when there is none. Null may be appended; nobody is told for it.
    void postLoad(QrPersistant* obj);

    /// Tells every object in order and drops it; those that are appended meanwhile are told too. A
    /// call from within leaves the work to the one that is running. When an object throws, it and
    /// those behind it stay.
    void loadFinished();

    /// Moves all entries to the end of `other`. An entry that was appended last stays so for this
    /// list: the next one appended here goes behind it, into the other list. Moving to itself does
    /// nothing.
    void transfer(QrPostLoadList& other);

  private:
    struct Node;

    std::shared_ptr<Node> first;
    /// The entry appended last, which may stand in another list by now; nothing once it was told.
    std::weak_ptr<Node> last;
    bool telling = false;
};

} // namespace Mz
