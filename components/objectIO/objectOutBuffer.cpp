#include "components/objectIO/objectIO.h"
#include "components/objectIO/objectRecord.h"
#include "components/objectIO/objectTable.h"

#include <algorithm>
#include <climits>
#include <cwchar>
#include <limits>
#include <unordered_map>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/objectOutBuffer";

[[noreturn]] void fail(const QrBufferedIO& io, int line, const std::string& what) {
    throw QrStreamEx::ExWriteObject(source, line, ObjectRecord::reason(io.tell(), what).c_str());
}

/// Whether a text stream writes the character as part of a number that can be read back: those of
/// infinities and of what is no number are not.
bool isOfNumber(wchar_t c) {
    return c != L'\0' && std::wcschr(L"0123456789+-.e", c);
}

/// Whether the character, if the locale writes it at all, comes back. Some locales write one that
/// looks similar instead.
bool readsBack(wchar_t character) {
    char bytes[MB_LEN_MAX];
    std::mbstate_t writing{};
    const std::size_t length = std::wcrtomb(bytes, character, &writing);
    if (length == static_cast<std::size_t>(-1))
        return true; // It is refused where it is written.
    wchar_t again = L'\0';
    std::mbstate_t reading{};
    const std::size_t read = std::mbrtowc(&again, bytes, length, &reading);
    return read == (character == L'\0' ? 0 : length) && again == character;
}

} // namespace

struct QrObjectOutBuffer::State {
    /// The numbers of the objects, by principal object.
    std::unordered_map<const QrCastable*, std::uint32_t> numbers;
    using Objects = ObjectTable<QrCPtr<QrCastable>>;
    Objects kept;
    int depth = 0;
    bool exactStrings = true; ///< whether the stream that writes carries strings as they are
    bool failed = false;

    /// Gives the next number to an object, which is written while the result exists.
    Objects::Entry add(const QrCastable* principal) {
        const auto number = static_cast<std::uint32_t>(kept.size() + 1);
        const auto place = numbers.emplace(principal, number).first;
        try {
            return Objects::Entry(kept, QrCPtr<QrCastable>(principal));
        } catch (...) {
            numbers.erase(place);
            throw;
        }
    }
};

QrObjectOutBuffer::QrObjectOutBuffer(QrCastable* io)
    : QrCastImpl(io), state(std::make_unique<State>()) {}

QrObjectOutBuffer::~QrObjectOutBuffer() = default;

void QrObjectOutBuffer::writeObject(const QrCastable* obj, QrStream& s, const wchar_t*,
                                    const wchar_t*) {
    if (state->failed)
        fail(inner(), __LINE__, "an earlier object failed");
    const QrCastable* principal = obj ? obj->getCastable() : nullptr;
    const auto known = state->numbers.find(principal);
    const bool isNew = principal && known == state->numbers.end();
    // What is new must be fit for writing, before anything of it is written.
    const QrPtr<QrPersistant> object =
        isNew ? queryCast<QrPersistant>(const_cast<QrCastable*>(obj)) : nullptr;
    if (isNew && !object)
        fail(inner(), __LINE__, "the object is not persistent");
    if (isNew && state->depth >= QrMaximumObjectDepth)
        fail(inner(), __LINE__, "objects are nested too deeply");
    if (isNew && state->kept.size() == std::numeric_limits<std::uint32_t>::max())
        fail(inner(), __LINE__, "there are too many objects");

    if (!isNew)
        return writeRecord(s, principal ? known->second : ObjectRecord::null, nullptr);
    const State::Objects::Entry entry = state->add(principal);
    writeRecord(s, static_cast<std::uint32_t>(state->kept.size()), object.get());
}

void QrObjectOutBuffer::writeRecord(QrStream& s, std::uint32_t number, QrPersistant* object) {
    // Until the record is whole, it counts as failed.
    struct Writing {
        State& state;
        const bool previousExactStrings;
        bool complete = false;
        Writing(State& now, bool exactStrings)
            : state(now), previousExactStrings(now.exactStrings) {
            state.exactStrings = exactStrings;
            ++state.depth;
        }
        ~Writing() {
            --state.depth;
            state.exactStrings = previousExactStrings;
            state.failed = state.failed || !complete;
        }
    } writing(*state, s.isBinaryStream());
    s << number;
    if (object) {
        s << *object->getClassUid() << object->getVersion();
        object->write(s);
        if (state->failed)
            fail(inner(), __LINE__, "an object inside this one failed");
    }
    if (object || state->depth == 1)
        s << ObjectRecord::endMark(number);
    writing.complete = true;
}

int QrObjectOutBuffer::writeChar(const wchar_t* s, int count) {
    const wchar_t* end = s + std::max(count, 0);
    if (state->exactStrings && std::find(s, end, L'\0') != end)
        throw QrStreamEx::ExWriteError(source, __LINE__, "a string has a NUL in it");
    if (state->exactStrings && !std::all_of(s, end, readsBack))
        throw QrStreamEx::ExWriteError(source, __LINE__,
                                       "a string has a character that the locale does not know");
    constexpr const char* inexact =
        "a text stream carries neither strings nor infinite numbers exactly";
    if (!state->exactStrings && !std::all_of(s, end, isOfNumber))
        throw QrStreamEx::ExWriteError(source, __LINE__, inexact);
    return inner().writeChar(s, count);
}

} // namespace Mz
