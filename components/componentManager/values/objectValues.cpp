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
    QrPtr<QrPersistant> wantsToBeTold;
    QrRef<QrCastable> object;
    {
        // Objects may be read inside the object, each with a place of its own; whatever happens,
        // the place of the object around this one is the current one again afterwards.
        struct Holder {
            QrPtr<QrPersistant>*& current;
            QrPtr<QrPersistant>* const previous;
            ~Holder() { current = previous; }
        } const holder{postLoadHolder, std::exchange(postLoadHolder, &wantsToBeTold)};
        object = io().readObject(*this, uid, a, b);
    }
    if (wantsToBeTold)
        postLoadList.postLoad(wantsToBeTold.get());
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
