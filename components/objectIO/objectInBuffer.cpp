// SPDX-License-Identifier: BSL-1.0
/// Reads object records (objectRecord.h). A new object is in the table before it reads itself, so
/// that an object inside it can refer back to it. Nested objects pass through `readObject` again;
/// each level restores the stream and form of the level around it. A failure is explained once, at
/// each level with the position of that level's object, and stops all later reads: after it the
/// position in the data is unknown.
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/numberRelay.h"
#include "components/objectIO/objectIO.h"
#include "components/objectIO/objectRecord.h"
#include "components/objectIO/objectTable.h"
#include "components/objectIO/objectText.h"

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <typeinfo>
#include <utility>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/objectInBuffer";

/// Whether the object has the interface, itself or by a translation, in the order of the casts.
bool supports(QrCastable& object, const QrUid& uid) {
    return object.hasInterface(uid) ||
           QrPtr<QrCastable>::adopt(QrTranslateInterface(&object, uid)) != nullptr;
}

/// Reads a string in text form. Only the empty one is written.
int readTextString(QrBufferedIO& io, wchar_t* buf, int size, int count) {
    if (size > 0)
        throw QrStreamEx::ExReadError(source, __LINE__,
                                      "a text stream cannot carry strings exactly");
    io.skipWhiteSpace(1); // The separator after its length.
    return io.readChar(buf, size, count);
}

/// The class of an object, as it is stored.
struct StoredClass {
    QrUid uid{};
    std::uint32_t version = 0;
};

/// A binary stream reads all numbers at once. A derived one may read single ones in its own way.
StoredClass readClass(QrStream& s) {
    StoredClass stored;
    if (typeid(s) != typeid(QrBinaryStream)) {
        s >> stored.uid >> stored.version;
        return stored;
    }
    std::uint32_t words[5];
    if (s.read(words[0], std::size(words)) < static_cast<int>(std::size(words)))
        throw QrStreamEx::ExReadError(source, __LINE__);
    stored.uid = {words[0], words[1], words[2], words[3]};
    stored.version = words[4];
    return stored;
}

int readTextBool(QrBufferedIO& io, wchar_t* digit) {
    // The stream does not skip the separator that may precede it.
    io.skipWhiteSpace(1);
    const int got = io.readChar(digit, 1, 1);
    if (got == 1 && *digit != L'0' && *digit != L'1')
        throw QrStreamEx::ExReadError(source, __LINE__, "a bool is neither 0 nor 1");
    return got;
}

/// Where the inner IO is, for messages. Asking it may cost a call of the system, which takes longer
/// than reading a small object, so what is read is counted from its last answer, until something is
/// read that is not counted. As long as an object comes from bytes that a standard buffer holds,
/// the IO is not even asked where it began: that can be computed later.
///
/// Places are distances from the first answer, or from the begin of the outermost object as long as
/// there is no answer. They are negative if they are not known.
class Place {
  public:
    /// Compares the names of the classes: on Windows a library may have its own description of one.
    explicit Place(const QrBufferedIO& inner)
        : io(inner),
          buffer(typeid(inner) == typeid(QrInBuffer) ? static_cast<const QrInBuffer*>(&inner)
                                                     : nullptr) {}

    /// An outermost object begins. Between objects the program may use the inner IO by itself.
    void begin() {
        unasked = holds(0);
        known = unasked;
        place = 0;
        origin = 0;
    }

    /// Returns the current place.
    int64 now() {
        if (!known) {
            place = distance(io.tell(), origin);
            known = true;
        }
        return place;
    }

    /// Returns the position of a place in the data, negative if it is not known.
    int64 position(int64 of) {
        ask();
        return of < 0 || origin < 0 ? -1 : origin + of;
    }

    /// Up to `size` bytes are read next. If the buffer does not hold them it asks the medium, which
    /// may fail, and then the begin of the object could no longer be computed.
    void expect(int size) {
        if (unasked && !holds(size))
            ask();
    }

    /// Something is read that is not counted.
    void forget() {
        ask();
        known = false;
    }

    void advance(int bytes) {
        if (place >= 0 && bytes > 0)
            place += bytes;
    }

    /// Counts what `read` returns, after at most `size` bytes. Forgets the place if it throws.
    template <class Read>
    int advanceBy(int size, const Read& read) {
        expect(size);
        const bool wasKnown = std::exchange(known, false);
        const int bytes = read();
        known = wasKnown;
        advance(bytes);
        return bytes;
    }

  private:
    static int64 distance(int64 position, int64 from) {
        return position < 0 || from < 0 ? -1 : position - from;
    }

    /// Returns whether a buffer of the standard library holds the next `size` bytes.
    bool holds(int size) const { return buffer && buffer->heldBytes() >= size; }

    void ask() {
        if (!std::exchange(unasked, false))
            return;
        origin = distance(io.tell(), place);
        if (origin < 0)
            place = -1;
    }

    const QrBufferedIO& io;
    const QrInBuffer* const buffer; ///< `io`, if it is exactly of this class
    int64 place = -1;
    int64 origin = 0;     ///< the position from which places are counted
    bool known = false;   ///< whether `place` is the current one
    bool unasked = false; ///< whether `origin` is still to be asked for
};

} // namespace

struct QrObjectInBuffer::State {
    explicit State(const QrBufferedIO& inner) : place(inner) {}

    /// All objects, including those that are still being read.
    using Objects = ObjectTable<QrRef<QrCastable>>;
    Objects objects;
    int depth = 0;
    Place place;
    const QrStream* stream = nullptr; ///< the stream that reads an object; null outside objects
    ObjectForm form = ObjectForm::Binary;
    bool readText = false; ///< whether the last read was of text
    bool failed = false;
    std::string explanation; ///< the reason of the last failure: position and fault

    QrStream::TextKind textKind() const {
        return stream ? stream->textKind() : QrStream::TextKind::Other;
    }

    [[noreturn]] void fail(int line, int64 begin, const std::string& what) {
        failed = true;
        explanation = ObjectRecord::reason(place.position(begin), what);
        throw QrStreamEx::ExReadObject(source, line, explanation.c_str());
    }

    /// Whether `fail` threw this exception, at this level or inside it.
    bool hasExplained(const ExBase& failure) const {
        return !explanation.empty() &&
               std::string_view(failure.getReason()).starts_with(explanation);
    }

    /// Throws the exception of an object's code again, with the position of the object.
    [[noreturn]] void failInside(int64 begin, const ExBase& failure) {
        fail(__LINE__, begin,
             std::string("inside the object that begins here: ") + failure.getReason());
    }

    /// Reads the end mark. A message about a wrong one gives `begin`, or without it the place of
    /// the mark.
    void expectMark(QrStream& s, std::uint32_t number, std::optional<int64> begin = {}) {
        // The place of a binary mark, which has a fixed size, is determined after it: it may have
        // to be asked for, and rarely is.
        if (form != ObjectForm::Binary && !begin)
            begin = place.now();
        std::uint32_t mark = 0;
        s >> mark;
        if (mark == ObjectRecord::endMark(number))
            return;
        if (!begin) {
            const int64 end = place.now();
            begin = end < 0 ? end : end - int64{sizeof mark};
        }
        fail(__LINE__, *begin, "the object should end here and does not");
    }
};

QrObjectInBuffer::QrObjectInBuffer(QrCastable* io)
    : QrCastImpl(io), state(std::make_unique<State>(inner())) {}

QrObjectInBuffer::~QrObjectInBuffer() = default;

QrRef<QrCastable> QrObjectInBuffer::readObject(QrStream& s, const QrUid* id, const wchar_t*,
                                               const wchar_t*) {
    if (state->depth == 0)
        state->place.begin();
    const int64 begin = state->place.now();
    if (state->failed)
        state->fail(__LINE__, begin, "an earlier object failed");
    // The object counts as failed until it is complete.
    struct Reading {
        State& state;
        const QrStream* const previousStream;
        const ObjectForm previousForm;
        bool complete = false;
        Reading(State& now, const QrStream& stream)
            : state(now), previousStream(now.stream), previousForm(now.form) {
            state.stream = &stream;
            state.form = formOf(stream);
            ++state.depth;
        }
        ~Reading() {
            --state.depth;
            state.stream = previousStream;
            state.form = previousForm;
            state.failed = state.failed || !complete;
        }
    } reading(*state, s);

    QrRef<QrCastable> object;
    try {
        object = readRecord(s, begin);
    } catch (const QrStreamEx::ExReadObject& failure) {
        if (state->hasExplained(failure))
            throw;
        state->failInside(begin, failure);
    } catch (const QrStreamEx& failure) {
        state->failInside(begin, failure);
    } catch (const QrComponentManagerEx& failure) {
        state->failInside(begin, failure);
    }
    if (object && id && !supports(*object, *id))
        state->fail(__LINE__, begin, "the object has not the interface " + ObjectRecord::text(*id));
    reading.complete = true;
    return object;
}

QrRef<QrCastable> QrObjectInBuffer::readRecord(QrStream& s, int64 begin) {
    std::uint32_t number = 0;
    s >> number;
    if (number > state->objects.size()) {
        if (number != state->objects.size() + 1)
            state->fail(__LINE__, begin, "no object begins here");
        if (state->depth > QrMaximumObjectDepth)
            state->fail(__LINE__, begin, "objects are nested too deeply");
        return readNewObject(s, number, begin);
    }
    if (state->depth == 1)
        state->expectMark(s, number, begin);
    return number == ObjectRecord::null ? nullptr : state->objects.at(number);
}

QrRef<QrCastable> QrObjectInBuffer::readNewObject(QrStream& s, std::uint32_t number, int64 begin) {
    const auto [classUid, version] = readClass(s);
    // Keeps the object alive while its code runs, whatever the code does with other references.
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(classUid);
    const QrPtr<QrPersistant> persistant = queryCast<QrPersistant>(object.get());
    if (!persistant)
        state->fail(__LINE__, begin,
                    "no builder makes persistent objects of the class " +
                        ObjectRecord::text(classUid));
    if (!(*persistant->getClassUid() == classUid))
        state->fail(__LINE__, begin,
                    "the builder of the class " + ObjectRecord::text(classUid) +
                        " makes objects of the class " +
                        ObjectRecord::text(*persistant->getClassUid()));
    if (persistant->getVersion() != version)
        state->fail(__LINE__, begin,
                    "the class " + ObjectRecord::text(classUid) + " is stored in version " +
                        std::to_string(version) + " and known in version " +
                        std::to_string(persistant->getVersion()));
    const State::Objects::Entry entry(state->objects, QrRef<QrCastable>(object->getCastable()));
    persistant->read(s);
    if (state->failed)
        state->fail(__LINE__, begin, "an object inside this one failed");
    state->expectMark(s, number);
    return state->objects.at(number);
}

int QrObjectInBuffer::readChar(wchar_t* buf, int size, int count) {
    // The operation shows in the arguments: only strings are read without a limit of characters,
    // and only a bool as a single one.
    constexpr int noLimit = 0x7fffffff;
    const bool isText = state->form == ObjectForm::Text;
    const QrStream::TextKind kind = state->textKind();
    state->readText = kind != QrStream::TextKind::Other;
    state->place.forget();
    if (count == noLimit && (isText || kind == QrStream::TextKind::String))
        return readTextString(inner(), buf, size, count);
    if (count == 1 && size == 1 &&
        (isText || (state->form == ObjectForm::Mixed && kind == QrStream::TextKind::Value)))
        return readTextBool(inner(), buf);
    const int got = inner().readChar(buf, size, count);
    // A NUL byte is never consumed: it would fill each of any number of strings.
    if (count == noLimit && got > 0 && std::find(buf, buf + got, L'\0') != buf + got)
        throw QrStreamEx::ExReadError(source, __LINE__, "a string has a NUL in it");
    return got;
}

int QrObjectInBuffer::readChar(wchar_t& c) {
    state->readText = state->textKind() != QrStream::TextKind::Other;
    state->place.forget();
    return inner().readChar(c);
}

int QrObjectInBuffer::readChar(char* buf, int size, int count) {
    state->place.forget();
    return inner().readChar(buf, size, count);
}

int QrObjectInBuffer::readChar(char& c) {
    state->place.forget();
    return inner().readChar(c);
}

void QrObjectInBuffer::skipWhiteSpace(int count) {
    state->place.forget();
    inner().skipWhiteSpace(count);
}

void QrObjectInBuffer::ungetc(wchar_t c) {
    state->place.forget();
    inner().ungetc(c);
}

void QrObjectInBuffer::ungetc(char c) {
    state->place.forget();
    inner().ungetc(c);
}

int64 QrObjectInBuffer::seek(int64 offset, int origin) {
    state->place.forget();
    return inner().seek(offset, origin);
}

int QrObjectInBuffer::read(void* data, int size) {
    if (state->form == ObjectForm::Text)
        throw QrStreamEx::ExReadError(source, __LINE__,
                                      "a text stream cannot carry arrays of characters");
    if (state->form == ObjectForm::Mixed && size > 0 && state->readText) {
        if (read() != '\n')
            throw QrStreamEx::ExReadError(source, __LINE__,
                                          "binary data after text begins on a new line");
        state->readText = false;
    }
    return state->place.advanceBy(size, [&] { return inner().read(data, size); });
}

int QrObjectInBuffer::read() {
    int byte = -1;
    state->place.advanceBy(1, [&] {
        byte = inner().read();
        return byte < 0 ? 0 : 1;
    });
    return byte;
}

/// What `readChar` does for each character of a number.
struct ObjectInputRelay {
    static QrBufferedIO* input(QrBufferedIO& io) {
        auto& objects = static_cast<QrObjectInBuffer&>(io);
        QrObjectInBuffer::State& state = *objects.state;
        state.readText = state.textKind() != QrStream::TextKind::Other;
        state.place.expect(1);
        return &objects.inner();
    }

    static void noteRead(QrBufferedIO& io, int bytes) {
        static_cast<QrObjectInBuffer&>(io).state->place.advance(bytes);
    }
};

namespace {

const QrNumberRelay relay(typeid(QrObjectInBuffer), {.input = ObjectInputRelay::input,
                                                     .noteRead = ObjectInputRelay::noteRead});

} // namespace

} // namespace Mz
