// SPDX-License-Identifier: BSL-1.0
/// The object IO of libMZobjectIO is above this library, and makes objects through the component
/// manager, which is not initialised here. The two buffers below store objects inside objects in
/// the simplest way: a number for null, for a new object, or for one that was stored before.
///
/// Both pass numbers on to a buffer of the core, as the object IO does. Otherwise a text stream
/// would switch the locale for each number, which for 100,000 of them takes a minute on Windows,
/// and the library would be said to hang.
#include "components/componentTools/checking/checkObjects.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/numberRelay.h"
#include "components/componentManager/textStream.h"

#include <algorithm>
#include <array>
#include <memory>
#include <sstream>

namespace Mz::Tools {

namespace {

constexpr const char* source = "components/componentTools/checking/checkObjects";

constexpr unsigned int nullObject = 0, newObject = 1, firstKnown = 2;

/// Objects that refer to one another without end must not overflow the stack.
constexpr int maximumDepth = 200;

class ObjectsOut final : public QrOutBuffer {
  public:
    ObjectsOut(std::ostream* out, CheckContext& checked)
        : QrOutBuffer(out), numbers(out), context(checked) {}

    static QrBufferedIO* numbersOf(QrBufferedIO& io) {
        return &static_cast<ObjectsOut&>(io).numbers;
    }

    /// Returns the class uids of the inner objects that no builder of the library has, each once.
    const std::vector<QrUid>& missingClasses() const { return missing; }

    void writeObject(const QrCastable* object, QrStream& stream, const wchar_t*,
                     const wchar_t*) override {
        const QrPtr<QrPersistant> stored = queryCast<QrPersistant>(const_cast<QrCastable*>(object));
        if (!object) {
            stream << nullObject;
            return;
        }
        if (!stored || depth >= maximumDepth)
            throw QrStreamEx::ExWriteObject(source, __LINE__);
        const auto known = std::find(written.begin(), written.end(), object->getCastable());
        if (known != written.end()) {
            stream << static_cast<unsigned int>(firstKnown + (known - written.begin()));
            return;
        }
        const QrUid* const classUid = stored->getClassUid();
        if (!classUid)
            throw QrStreamEx::ExWriteObject(source, __LINE__);
        if (!context.describedAs(*classUid) &&
            std::find(missing.begin(), missing.end(), *classUid) == missing.end())
            missing.push_back(*classUid);
        written.push_back(object->getCastable());
        stream << newObject << *classUid;
        ++depth;
        stored->write(stream);
        --depth;
    }

  private:
    QrOutBuffer numbers;
    CheckContext& context;
    std::vector<const QrCastable*> written;
    std::vector<QrUid> missing;
    int depth = 0;
};

class ObjectsIn final : public QrInBuffer {
  public:
    ObjectsIn(std::istream* in, CheckContext& checked)
        : QrInBuffer(in), numbers(in), context(checked) {}

    static QrBufferedIO* numbersOf(QrBufferedIO& io) {
        return &static_cast<ObjectsIn&>(io).numbers;
    }

    QrRef<QrCastable> readObject(QrStream& stream, const QrUid*, const wchar_t*,
                                 const wchar_t*) override {
        unsigned int number = 0;
        stream >> number;
        if (number == nullObject)
            return nullptr;
        if (number >= firstKnown + objects.size() || depth >= maximumDepth)
            throw QrStreamEx::ExReadObject(source, __LINE__);
        if (number >= firstKnown)
            return objects[number - firstKnown];
        QrUid classUid{};
        stream >> classUid;
        const DescribedBuilder* const described = context.describedAs(classUid);
        QrRef<QrCastable> object;
        if (described)
            object = makeInside(*described);
        const QrPtr<QrPersistant> stored = queryCast<QrPersistant>(object.get());
        if (!stored)
            throw QrStreamEx::ExReadObject(source, __LINE__);
        objects.push_back(object);
        ++depth;
        stored->read(stream);
        --depth;
        return object;
    }

  private:
    /// Not through `attempt`, which must not be nested.
    QrRef<QrCastable> makeInside(const DescribedBuilder& described) {
        const QrRef<QrCastable> made = context.description()->createBuilder(described.uid);
        const QrPtr<QrComponentBuilder> builder = queryCast<QrComponentBuilder>(made.get());
        return builder ? builder->createObject() : nullptr;
    }

    QrInBuffer numbers;
    CheckContext& context;
    std::vector<QrRef<QrCastable>> objects;
    int depth = 0;
};

const QrNumberRelay outRelay(typeid(ObjectsOut), {ObjectsOut::numbersOf, nullptr, nullptr});
const QrNumberRelay inRelay(typeid(ObjectsIn), {nullptr, nullptr, ObjectsIn::numbersOf});

/// Supplies three bytes at a time and has no positions, like a pipe.
class Pieces final : public std::streambuf {
  public:
    explicit Pieces(std::string content) : bytes(std::move(content)) {}

  protected:
    int_type underflow() override {
        const std::size_t size = std::min(piece.size(), bytes.size() - next);
        if (size == 0)
            return traits_type::eof();
        std::copy_n(bytes.begin() + static_cast<std::ptrdiff_t>(next), size, piece.begin());
        next += size;
        setg(piece.data(), piece.data(), piece.data() + size);
        return traits_type::to_int_type(piece.front());
    }

  private:
    std::string bytes;
    std::size_t next = 0;
    std::array<char, 3> piece{};
};

std::unique_ptr<QrStream> streamOf(QrCastable& io, StoredForm form) {
    if (form == StoredForm::binary)
        return std::make_unique<QrBinaryStream>(&io);
    return std::make_unique<QrTextStream>(&io);
}

} // namespace

std::optional<std::string> writtenBytes(CheckContext& context, const std::wstring& place,
                                        QrPersistant& object, StoredForm form) {
    std::ostringstream bytes;
    const bool written = context.attempt(L"write", place, [&] {
        ObjectsOut buffer(&bytes, context);
        object.write(*streamOf(buffer, form));
    });
    return written ? std::optional(bytes.str()) : std::nullopt;
}

std::vector<QrUid> missingClassesInside(CheckContext& context, const std::wstring& place,
                                        QrPersistant& object) {
    std::ostringstream bytes;
    ObjectsOut buffer(&bytes, context);
    context.attempt(L"write", place, [&] { object.write(*streamOf(buffer, StoredForm::binary)); });
    return buffer.missingClasses();
}

bool readBytes(CheckContext& context, const std::wstring& place, QrPersistant& object,
               StoredForm form, const std::string& bytes, Supply supply, const std::wstring& detail,
               const std::string& reproduce) {
    std::istringstream whole(bytes);
    Pieces pieces(bytes);
    std::istream inPieces(&pieces);
    std::istream& input = supply == Supply::whole ? static_cast<std::istream&>(whole) : inPieces;
    return context.attempt(
        L"read", place,
        [&] {
            ObjectsIn buffer(&input, context);
            object.read(*streamOf(buffer, form));
        },
        detail, reproduce);
}

} // namespace Mz::Tools
