// SPDX-License-Identifier: BSL-1.0
/// Objects and uids on streams. The IO reads and writes objects; the stream keeps the requests for
/// a notification. An object joins the post-load list when it is complete, so objects inside it
/// come before it. An object whose reading throws does not join.
#include "components/componentManager/stream.h"

#include <utility>

namespace Mz {

void QrStream::postLoad(QrPersistant* obj) {
    if (postLoadHolder)
        *postLoadHolder = obj;
}

void QrStream::transfer(QrPostLoadList& target) {
    postLoadList.transfer(target);
}

QrRef<QrCastable> QrStream::readObject(const QrUid* uid, const wchar_t* a, const wchar_t* b) {
    skipSeparator();
    QrPtr<QrPersistant> request;
    QrRef<QrCastable> object;
    {
        // Objects inside this one have their own holders. The holder of the object around this one
        // is current again afterwards, also after an exception.
        struct Holder {
            QrPtr<QrPersistant>*& current;
            QrPtr<QrPersistant>* const previous;
            ~Holder() { current = previous; }
        } const holder{postLoadHolder, std::exchange(postLoadHolder, &request)};
        object = io().readObject(*this, uid, a, b);
    }
    if (request)
        postLoadList.postLoad(request.get());
    return object;
}

QrStream& QrStream::operator<<(const QrCastable* obj) {
    endText();
    io().writeObject(obj, *this, nullptr, nullptr);
    return *this;
}

QrStream& operator<<(QrStream& stream, const QrUid& uid) {
    return stream << uid.w0 << uid.w1 << uid.w2 << uid.w3;
}

QrStream& operator>>(QrStream& stream, QrUid& uid) {
    return stream >> uid.w0 >> uid.w1 >> uid.w2 >> uid.w3;
}

} // namespace Mz
