// SPDX-License-Identifier: BSL-1.0
/// The component: a class whose objects write themselves to a stream and read themselves back. The
/// uid of its builder is that of the class, so that a load finds the builder.
#include "person.h"

#include "components/componentKit/componentKit.h"
#include "components/objectIO/objectIO.h"

#include <utility>

using namespace Mz;

namespace {

class StoredPerson final : public Kit::Object<StoredPerson, Person, QrPersistant> {
  public:
    const QrUid* getClassUid() const override { return &personUid; }
    unsigned int getVersion() const override { return 1; }

    void write(QrStream& stream) override {
        QrWriteExactText(stream, name); // A text stream carries no other strings exactly.
        stream << born << static_cast<unsigned int>(children.size());
        for (const QrPtr<Person>& child : children)
            stream << child.get();
    }

    /// Changes the object only if all of it could be read. The count is not trusted: the list grows
    /// as its elements arrive.
    void read(QrStream& stream) override {
        std::wstring readName = QrReadExactText(stream);
        unsigned int readBorn = 0;
        unsigned int count = 0;
        stream >> readBorn >> count;
        std::vector<QrPtr<Person>> read;
        for (; count > 0; --count) {
            const QrRef<QrCastable> object = stream.readObject(&Person::uid, nullptr, nullptr);
            read.push_back(queryCast<Person>(object.get()));
            if (!read.back())
                throw QrStreamEx::ExReadError("people", __LINE__, "a child is missing");
        }
        name = std::move(readName);
        born = readBorn;
        children = std::move(read);
    }
};

} // namespace

MZ_COMPONENT(L"People", L"Persons that can be saved",
             Kit::builderOf<StoredPerson>({.uid = personUid, .name = L"person"}))
