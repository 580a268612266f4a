#include "components/objectIO/objectIO.h"
#include "components/objectIO/objectRecord.h"

#include <algorithm>
#include <cwchar>
#include <unordered_map>
#include <vector>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/objectOutBuffer";

[[noreturn]] void fail(const QrBufferedIO& io, int line, const std::string& what) {
    throw QrStreamEx::ExWriteObject(source, line,
                                    (ObjectRecord::positionText(io) + ": " + what).c_str());
}

/// Whether a text stream writes the character as part of a number.
bool isOfNumber(wchar_t c) {
    return c != L'\0' && std::wcschr(L"0123456789+-.einfa", c);
}

} // namespace

struct QrObjectOutBuffer::State {
    /// The numbers of the objects, by principal object.
    std::unordered_map<const QrCastable*, std::uint32_t> numbers;
    std::vector<QrCPtr<QrCastable>> kept;
    int depth = 0;
    bool inText = false;
    bool failed = false;
};

QrObjectOutBuffer::QrObjectOutBuffer(QrCastable* io)
    : QrCastImpl(io), state(std::make_unique<State>()) {}

QrObjectOutBuffer::~QrObjectOutBuffer() = default;

void QrObjectOutBuffer::writeObject(const QrCastable* obj, QrStream& s, const wchar_t*,
                                    const wchar_t*) {
    if (state->failed)
        fail(inner(), __LINE__, "an earlier object failed");
    if (!obj) {
        s << ObjectRecord::null;
        return;
    }
    const QrCastable* principal = obj->getCastable();
    if (const auto known = state->numbers.find(principal); known != state->numbers.end()) {
        s << known->second;
        return;
    }
    const QrPtr<QrPersistant> object = queryCast<QrPersistant>(const_cast<QrCastable*>(obj));
    if (!object)
        fail(inner(), __LINE__, "the object is not persistent");
    if (state->depth >= QrMaximumObjectDepth)
        fail(inner(), __LINE__, "objects are nested too deeply");

    state->kept.emplace_back(principal);
    const auto number = static_cast<std::uint32_t>(state->kept.size());
    state->numbers.emplace(principal, number);

    // Until the end mark stands, the object counts as failed.
    struct Writing {
        State& state;
        bool previousText;
        bool complete = false;
        Writing(State& now, bool text) : state(now), previousText(now.inText) {
            state.inText = text;
            ++state.depth;
        }
        ~Writing() {
            --state.depth;
            state.inText = previousText;
            state.failed = state.failed || !complete;
        }
    } writing(*state, s.isTextStream());
    s << number << *object->getClassUid() << object->getVersion();
    object->write(s);
    if (state->failed)
        fail(inner(), __LINE__, "an object inside this one failed");
    s << ObjectRecord::endMark(number);
    writing.complete = true;
}

int QrObjectOutBuffer::writeChar(const wchar_t* s, int count) {
    const bool readable = std::all_of(s, s + std::max(count, 0), [this](wchar_t c) {
        return state->inText ? isOfNumber(c) : c != L'\0';
    });
    if (!readable)
        throw QrStreamEx::ExWriteError(source, __LINE__,
                                       "the stream cannot carry this string exactly");
    return inner().writeChar(s, count);
}

} // namespace Mz
