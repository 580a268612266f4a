// SPDX-License-Identifier: BSL-1.0
/// Objects that are stored on streams, and their notification after a load.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/export.h"

#include <memory>

namespace Mz {

class QrStream;

/// The interface of objects that write themselves to a stream and read themselves back.
///
/// An object whose links need other complete objects resolves them after the load: its `read` calls
/// `stream.postLoad(this)`, and `loadFinished` is called when the whole load is over.
class MZ_COMPONENT_MANAGER_API QrPersistant : public QrCastable {
  public:
    using Self = QrPersistant;
    static constexpr QrUid uid{0x81C8DF24, 0xA78111D1, 0x988A4445, 0x53540000};

    ~QrPersistant() override;

    /// Returns the identity of the object's class, not of this interface. Never null. The pointer
    /// stays valid as long as the class's library is loaded.
    virtual const QrUid* getClassUid() const = 0;
    /// Returns the version of the stored form, which distinguishes old data from new.
    virtual unsigned int getVersion() const = 0;
    /// Writes the object. Exceptions of the stream pass through.
    virtual void write(QrStream& stream) = 0;
    /// Reads what `write` wrote. Exceptions of the stream pass through.
    virtual void read(QrStream& stream) = 0;

    /// Notifies the object that the whole load is over, if it requested that. The default is a
    /// no-op.
    virtual void loadFinished();

  private:
    /// Has no effect. Anchors the vtable in this library.
    virtual void forceVtblInstantiation();
};

/// The post-load list: the objects to notify after a load, in order.
///
/// Owns one reference for each entry. An object that was appended twice is notified twice. Used by
/// one thread at a time.
class MZ_COMPONENT_MANAGER_API QrPostLoadList {
  public:
    QrPostLoadList();
    /// Releases the remaining objects without notifying them.
    ~QrPostLoadList();
    QrPostLoadList(const QrPostLoadList&) = delete;
    QrPostLoadList& operator=(const QrPostLoadList&) = delete;

    /// Appends `obj` and takes a reference to it. The new entry follows the one appended last, even
    /// if that is in another list by now (`transfer`); without one it goes to the end.
    ///
    /// \param obj  the object, or null for an entry without a notification
    void postLoad(QrPersistant* obj);

    /// Notifies each object in order and releases it, also those appended meanwhile. A nested call
    /// is a no-op: the running one continues.
    ///
    /// If an object throws, the exception passes through; that object and those after it remain.
    void loadFinished();

    /// Moves all entries to the end of `other`. This list still appends after the entry that it
    /// appended last, so its next entry goes into `other` too. A no-op if `other` is this list.
    void transfer(QrPostLoadList& other);

  private:
    struct Node;

    std::shared_ptr<Node> first;
    /// The entry appended last, which may be in another list by now; expired after its
    /// notification.
    std::weak_ptr<Node> last;
    bool notifying = false;
};

} // namespace Mz
