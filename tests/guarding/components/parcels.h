// SPDX-License-Identifier: BSL-1.0
/// The classes of the objects that the hostile importers import.
#pragma once

#include "components/componentKit/componentKit.h"
#include "components/objectIO/objectIO.h"
#include "tests/guarding/components/parcel.h"

#include <functional>
#include <stdexcept>

namespace Mz::Test {

/// A parcel that can be stored.
template <const QrUid& identity>
class StoredParcel final
    : public QrCastRef<QrCastHeap<QrCastMulti<StoredParcel<identity>, Parcel, QrPersistant>>> {
  public:
    /// What `write` does first; may be empty.
    std::function<void()> act;

    const QrUid* getClassUid() const override { return &identity; }
    unsigned int getVersion() const override { return 1; }

    void write(QrStream& stream) override {
        if (act)
            act();
        QrWriteExactText(stream, this->text);
        stream << this->first.get() << this->second.get();
    }

    void read(QrStream& stream) override {
        if (identity == fussyUid)
            throw std::logic_error("a fussy parcel");
        this->text = QrReadExactText(stream);
        for (Parcel*& link : pending)
            link = queryCast<Parcel>(stream.readObject(&Parcel::uid, nullptr, nullptr).get()).get();
        stream.postLoad(this);
    }

    /// Links the parcels. Until then the reader owns them, so that a failed load leaves no circle.
    void loadFinished() override {
        this->first = pending[0];
        this->second = pending[1];
    }

  private:
    Parcel* pending[2] = {};
};

/// A parcel that cannot be stored.
class Fleeting final : public QrCastRef<QrCastHeap<QrCastImpl<Fleeting, Parcel>>> {};

} // namespace Mz::Test
