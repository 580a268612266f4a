// SPDX-License-Identifier: BSL-1.0
/// Both directions derive from the IO objects of libMZobjectIO and look at each object before the
/// base does. When it is written, so that an object that cannot come back is refused with the name
/// of its class. When it is read, so that a hostile answer can neither choose a class that the
/// caller did not allow nor keep the host busy with objects without end.
#include "components/componentTools/guarding/storedObject.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/probing/exceptionText.h"
#include "components/componentTools/uidText.h"
#include "components/objectIO/objectIO.h"

#include <algorithm>
#include <sstream>
#include <typeinfo>
#include <utility>

namespace Mz::Tools {

namespace {

constexpr const char* source = "components/componentTools/guarding/storedObject";

using Kit::ImportVerdict;

/// Returns the name of the object's class for people.
std::wstring classNameOf(const QrCastable& object) {
    const QrCastable* const principal = const_cast<QrCastable&>(object).getCastable();
    // A library that was compiled without type information has a null pointer in its place.
    const auto table = *reinterpret_cast<const void* const* const*>(principal);
    if (!table[-1])
        return L"(compiled without type information)";
    return typeText(typeid(*principal));
}

/// Returns whether the component manager knows a builder of this identity. Loads nothing.
bool isKnown(const QrUid& uid) {
    class Search final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
      public:
        explicit Search(const QrUid& wanted) : uid(wanted) {}
        Action process(QrCPtr<QrBuilderDescription> builder) override {
            return builder->getUid() == uid ? Stop : Continue;
        }

      private:
        const QrUid& uid;
    } search(uid);
    return QrGetComponentManager()->enumerateBuilders(search) == QrEnum::Stop;
}

/// Writes objects until it meets one that cannot be read back.
class NamingObjectOutput final : public QrObjectOutBuffer {
  public:
    using QrObjectOutBuffer::QrObjectOutBuffer;

    void writeObject(const QrCastable* object, QrStream& stream, const wchar_t* a,
                     const wchar_t* b) override {
        if (object)
            refuse(*object);
        QrObjectOutBuffer::writeObject(object, stream, a, b);
    }

    ImportOutcome refusal{ImportVerdict::imported, {}};

  private:
    void refuse(const QrCastable& object) {
        const auto persistant = queryCast<QrPersistant>(&const_cast<QrCastable&>(object));
        if (!persistant)
            return refuse(ImportVerdict::notPersistent, classNameOf(object));
        const QrUid& classUid = *persistant->getClassUid();
        if (classUid == known)
            return;
        if (!isKnown(classUid))
            return refuse(ImportVerdict::unknownClass,
                          classNameOf(object) + L" (" + textOf(classUid) + L")");
        known = classUid;
    }

    void refuse(ImportVerdict verdict, const std::wstring& name) {
        refusal = {verdict, name};
        throw QrStreamEx::ExWriteObject(source, __LINE__);
    }

    QrUid known{}; ///< the class of the last object
};

/// Reads objects within limits.
class LimitedObjectInput final : public QrObjectInBuffer {
  public:
    LimitedObjectInput(QrCastable* io, const Kit::ImportLimits& allowed)
        : QrObjectInBuffer(io), limits(allowed) {}

    QrRef<QrCastable> readObject(QrStream& stream, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override {
        if (++objects > limits.objects)
            throw QrStreamEx::ExReadObject(source, __LINE__, "there are too many objects");
        if (!limits.classes.empty())
            checkClass();
        return QrObjectInBuffer::readObject(stream, id, a, b);
    }

  private:
    /// Looks ahead at the class of the next object. One that was read before has none.
    void checkClass() {
        const int64 position = inner().tell();
        const std::uint32_t number = nextWord();
        if (number > newest) {
            newest = number;
            const QrUid classUid{nextWord(), nextWord(), nextWord(), nextWord()};
            if (std::find(limits.classes.begin(), limits.classes.end(), classUid) ==
                limits.classes.end())
                throw QrStreamEx::ExReadObject(source, __LINE__,
                                               "an object of a class that is not allowed");
        }
        inner().seek(position, 0);
    }

    /// Returns the next number, as a binary stream stores it. The end counts as zeros.
    std::uint32_t nextWord() {
        std::uint32_t word = 0;
        for (int count = 0; count < 4; ++count)
            word = word << 8 | static_cast<std::uint32_t>(std::max(inner().read(), 0));
        return word;
    }

    const Kit::ImportLimits& limits;
    std::uint64_t objects = 0;
    std::uint32_t newest = 0; ///< the number of the last new object
};

/// \throws whatever the code of the object throws
QrRef<QrCastable> restore(std::string bytes, const Kit::ImportLimits& limits) {
    std::istringstream content(std::move(bytes));
    QrInBuffer buffer(&content);
    LimitedObjectInput input(&buffer, limits);
    QrBinaryStream stream(&input);
    const QrRef<QrCastable> object = stream.readObject(nullptr, nullptr, nullptr);
    if (buffer.read() != -1)
        throw QrStreamEx::ExReadObject(source, __LINE__, "more data follows the object");
    if (!object)
        throw QrStreamEx::ExReadObject(source, __LINE__, "there is no object");
    QrPostLoadList list;
    stream.transfer(list);
    list.loadFinished();
    return object;
}

} // namespace

ImportOutcome storeObject(const QrCastable* object, std::string& bytes) {
    std::ostringstream content;
    QrOutBuffer buffer(&content);
    NamingObjectOutput output(&buffer);
    QrBinaryStream stream(&output);
    try {
        stream << object;
    } catch (const QrStreamEx&) {
        // An object may have caught the refusal of another one and thrown its own exception.
        if (output.refusal.verdict == ImportVerdict::imported)
            return {ImportVerdict::notStored, exceptionText()};
    }
    if (output.refusal.verdict == ImportVerdict::imported)
        bytes = std::move(content).str();
    return output.refusal;
}

ImportOutcome restoreObject(std::string bytes, const Kit::ImportLimits& limits,
                            QrRef<QrCastable>& object) {
    try {
        object = restore(std::move(bytes), limits);
        return {ImportVerdict::imported, {}};
    } catch (...) {
        return {ImportVerdict::answerRejected, exceptionText()};
    }
}

} // namespace Mz::Tools
