// SPDX-License-Identifier: BSL-1.0
/// Writes object records (objectRecord.h). Each object gets its number before it writes itself, so
/// that an object inside it can refer back to it. Nested objects pass through `writeObject` again;
/// each level restores the stream and form of the level around it. Checks that reject an object run
/// before any of it is written; a failure after that stops all later writes.
#include "components/componentManager/numberRelay.h"
#include "components/objectIO/objectIO.h"
#include "components/objectIO/objectRecord.h"
#include "components/objectIO/objectTable.h"
#include "components/objectIO/objectText.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <string>
#include <string_view>
#include <typeinfo>
#include <unordered_map>
#include <utility>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/objectOutBuffer";

[[noreturn]] void fail(const QrBufferedIO& io, int line, const std::string& what) {
    throw QrStreamEx::ExWriteObject(source, line, ObjectRecord::reason(io.tell(), what).c_str());
}

} // namespace

struct QrObjectOutBuffer::State {
    /// The numbers of the objects, by principal object.
    std::unordered_map<const QrCastable*, std::uint32_t> numbers;
    using Objects = ObjectTable<QrCPtr<QrCastable>>;
    Objects objects;
    int depth = 0;
    const QrStream* stream = nullptr; ///< the stream that writes an object; null outside objects
    ObjectForm form = ObjectForm::Binary;
    ObjectTextOutput text;
    bool failed = false;

    QrStream::TextKind textKind() const {
        return stream ? stream->textKind() : QrStream::TextKind::Other;
    }

    /// Gives the next number to an object. The result exists while the object is written.
    Objects::Entry add(const QrCastable* principal) {
        const auto number = static_cast<std::uint32_t>(objects.size() + 1);
        const auto place = numbers.emplace(principal, number).first;
        try {
            return Objects::Entry(objects, QrCPtr<QrCastable>(principal));
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
    // A new object is checked before any of it is written: a rejection must leave the IO usable.
    const QrPtr<QrPersistant> object =
        isNew ? queryCast<QrPersistant>(const_cast<QrCastable*>(obj)) : nullptr;
    if (isNew && !object)
        fail(inner(), __LINE__, "the object is not persistent");
    if (isNew && state->depth >= QrMaximumObjectDepth)
        fail(inner(), __LINE__, "objects are nested too deeply");
    if (isNew && state->objects.size() == std::numeric_limits<std::uint32_t>::max())
        fail(inner(), __LINE__, "there are too many objects");

    if (!isNew)
        return writeRecord(s, principal ? known->second : ObjectRecord::null, nullptr);
    const State::Objects::Entry entry = state->add(principal);
    writeRecord(s, static_cast<std::uint32_t>(state->objects.size()), object.get());
}

void QrObjectOutBuffer::writeRecord(QrStream& s, std::uint32_t number, QrPersistant* object) {
    // The record counts as failed until it is complete.
    struct Writing {
        State& state;
        const QrStream* const previousStream;
        const ObjectForm previousForm;
        bool complete = false;
        Writing(State& now, const QrStream& stream)
            : state(now), previousStream(now.stream), previousForm(now.form) {
            state.stream = &stream;
            state.form = formOf(stream);
            ++state.depth;
        }
        ~Writing() {
            --state.depth;
            state.stream = previousStream;
            state.form = previousForm;
            state.failed = state.failed || !complete;
        }
    } writing(*state, s);
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
    const std::wstring_view text(s, static_cast<std::size_t>(std::max(count, 0)));
    const QrStream::TextKind kind = state->textKind();
    ObjectTextOutput::check(kind, state->form, text);
    if (state->stream)
        state->text.begin(inner(), kind, state->form, text);
    return inner().writeChar(s, count);
}

void QrObjectOutBuffer::write(const void* data, int size) {
    if (state->stream && size > 0)
        state->text.beginData(inner(), state->form);
    inner().write(data, size);
}

void QrObjectOutBuffer::writeEol() {
    inner().writeEol();
    state->text.noteLineEnd();
}

void QrObjectOutBuffer::writeSpace() {
    inner().writeSpace();
    state->text.noteSpace();
}

/// What `writeSpace`, `writeEol` and `writeChar` do for a finite number that needs no blank before
/// it: they record it, and pass it on.
struct ObjectOutputRelay {
    static QrBufferedIO* output(QrBufferedIO& io) {
        auto& objects = static_cast<QrObjectOutBuffer&>(io);
        const QrObjectOutBuffer::State& state = *objects.state;
        const bool passes = !state.stream || (state.textKind() == QrStream::TextKind::Value &&
                                              state.text.continuesWithValue());
        return passes ? &objects.inner() : nullptr;
    }

    static void noteNumber(QrBufferedIO& io, char separator) {
        QrObjectOutBuffer::State& state = *static_cast<QrObjectOutBuffer&>(io).state;
        if (state.stream || separator == ' ')
            state.text.noteValue();
        else if (separator == '\n')
            state.text.noteLineEnd();
    }
};

namespace {

const QrNumberRelay relay(typeid(QrObjectOutBuffer),
                          {ObjectOutputRelay::output, ObjectOutputRelay::noteNumber, nullptr});

} // namespace

} // namespace Mz
