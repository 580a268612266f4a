#include "components/componentManager/componentImp.h"
#include "components/objectIO/objectIO.h"
#include "components/objectIO/objectRecord.h"

#include <vector>

namespace Mz {

namespace {

constexpr const char* source = "components/objectIO/objectInBuffer";

[[noreturn]] void fail(int line, const std::string& where, const std::string& what) {
    throw QrStreamEx::ExReadObject(source, line, (where + ": " + what).c_str());
}

} // namespace

struct QrObjectInBuffer::State {
    std::vector<QrRef<QrCastable>> objects;
    int depth = 0;
    bool inText = false;
    bool failed = false;
};

QrObjectInBuffer::QrObjectInBuffer(QrCastable* io)
    : QrCastImpl(io), state(std::make_unique<State>()) {}

QrObjectInBuffer::~QrObjectInBuffer() = default;

QrRef<QrCastable> QrObjectInBuffer::readObject(QrStream& s, const QrUid* id, const wchar_t*,
                                               const wchar_t*) {
    const std::string where = ObjectRecord::positionText(inner());
    if (state->failed)
        fail(__LINE__, where, "an earlier object failed");
    // Until all is well, the object counts as failed.
    struct Reading {
        State& state;
        bool previousText;
        bool complete = false;
        Reading(State& now, bool text) : state(now), previousText(now.inText) {
            state.inText = text;
            ++state.depth;
        }
        ~Reading() {
            --state.depth;
            state.inText = previousText;
            state.failed = state.failed || !complete;
        }
    } reading(*state, s.isTextStream());

    QrRef<QrCastable> object;
    try {
        object = readRecord(s);
    } catch (const QrStreamEx::ExReadObject&) {
        throw; // It says where already.
    } catch (const QrStreamEx& failure) {
        fail(__LINE__, where, std::string("inside the object that begins here: ") +
                                  failure.getReason());
    }
    if (state->failed)
        fail(__LINE__, where, "an object inside this one failed");
    if (object && id && !object->hasInterface(*id))
        fail(__LINE__, where, "the object has not the interface " + ObjectRecord::text(*id));
    reading.complete = true;
    return object;
}

QrRef<QrCastable> QrObjectInBuffer::readRecord(QrStream& s) {
    const std::string where = ObjectRecord::positionText(inner());
    std::uint32_t number = 0;
    s >> number;
    if (number == ObjectRecord::null)
        return nullptr;
    if (number <= state->objects.size())
        return state->objects[number - 1];
    if (number != state->objects.size() + 1)
        fail(__LINE__, where, "no object begins here");
    if (state->depth > QrMaximumObjectDepth)
        fail(__LINE__, where, "objects are nested too deeply");
    return readNewObject(s, number);
}

QrRef<QrCastable> QrObjectInBuffer::readNewObject(QrStream& s, std::uint32_t number) {
    const std::string where = ObjectRecord::positionText(inner());
    QrUid classUid{};
    unsigned int version = 0;
    s >> classUid >> version;
    // The reference keeps the object alive while its own code runs, whatever that does with it.
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(classUid);
    const QrPtr<QrPersistant> persistant = queryCast<QrPersistant>(object.get());
    if (!persistant)
        fail(__LINE__, where, "no builder makes persistent objects of the class " +
                                  ObjectRecord::text(classUid));
    if (!(*persistant->getClassUid() == classUid))
        fail(__LINE__, where, "the builder of the class " + ObjectRecord::text(classUid) +
                                  " makes objects of the class " +
                                  ObjectRecord::text(*persistant->getClassUid()));
    if (persistant->getVersion() != version)
        fail(__LINE__, where, "the class " + ObjectRecord::text(classUid) + " is stored in version " +
                                  std::to_string(version) + " and known in version " +
                                  std::to_string(persistant->getVersion()));
    state->objects.push_back(persistant->getCastable());
    persistant->read(s);
    const std::string endsAt = ObjectRecord::positionText(inner());
    std::uint32_t mark = 0;
    s >> mark;
    if (mark != ObjectRecord::endMark(number))
        fail(__LINE__, endsAt, "an object of the class " + ObjectRecord::text(classUid) +
                                   " should end here and does not");
    return state->objects[number - 1];
}

int QrObjectInBuffer::readChar(wchar_t* buf, int size, int count) {
    // Only strings are read without a limit of characters.
    constexpr int noLimit = 0x7fffffff;
    if (state->inText && count == noLimit)
        throw QrStreamEx::ExReadError(source, __LINE__,
                                      "a text stream cannot carry strings exactly");
    return inner().readChar(buf, size, count);
}

} // namespace Mz
