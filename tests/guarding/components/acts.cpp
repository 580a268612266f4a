// SPDX-License-Identifier: BSL-1.0
// Acts that end or hang a process, and acts that lie to the process that started it.
#include "tests/guarding/components/acts.h"

#include "components/base/exBase.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/processControl.h"
#include "tests/guarding/components/system.h"
#include "tests/support/testSystem.h"

#include <atomic>
#include <chrono>
#include <clocale>
#include <csignal>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <filesystem>
#include <fstream>
#include <functional>
#include <iostream>
#include <map>
#include <new>
#include <stdexcept>
#include <thread>
#include <vector>

namespace Mz::Test {

namespace {

// ---- Frames, as an attacker would write them -------------------------------------------------

/// Returns all parts, one after the other.
template <class... Parts>
std::string joined(const Parts&... parts) {
    std::string bytes;
    (bytes.append(parts), ...);
    return bytes;
}

std::string byte(int value) {
    return std::string(1, static_cast<char>(value));
}

std::string word(std::uint32_t value) {
    std::string bytes;
    for (int shift = 24; shift >= 0; shift -= 8)
        bytes += static_cast<char>(value >> shift & 255);
    return bytes;
}

std::string frame(int kind, const std::string& payload) {
    std::uint32_t sum = 2166136261u;
    for (const char byte : payload)
        sum = (sum ^ static_cast<unsigned char>(byte)) * 16777619u;
    return joined("MZPR", byte(kind), word(static_cast<std::uint32_t>(payload.size())), payload,
                  word(sum));
}

constexpr int stageKind = 131, callKind = 132, objectKind = 133, outcomeKind = 134;

std::string outcome(int verdict) {
    return frame(outcomeKind, joined(byte(verdict), word(0)));
}

/// A call of the process controller without texts.
std::string call(int function) {
    return frame(callKind, joined(byte(function), word(0), word(0), word(0), byte(0), byte(0)));
}

/// The stored form of a parcel of the class `uidOfTestFamily` that refers to itself twice.
std::string storedCircle(std::uint32_t number) {
    const std::string uid =
        joined(word(number), word(0x3C5A11EF), word(0x8D1B2C00), word(0x6F40A9D7));
    return joined(word(1), uid, word(1), word(0), word(1), word(1), word(0x454F424Bu));
}

// ---- Acts ------------------------------------------------------------------------------------

volatile int sink = 0;
volatile bool forever = true;

void crash() {
    sink = *static_cast<volatile int*>(nullptr);
}

void hang() {
    while (forever)
        sink = sink + 1;
}

int recurse(int depth) {
    volatile char frame[4096];
    frame[0] = static_cast<char>(depth);
    return forever ? recurse(depth + 1) + frame[0] : 0;
}

void eatMemory() {
    std::vector<char*> blocks;
    while (forever) {
        constexpr std::size_t size = std::size_t{4} << 20;
        blocks.push_back(new char[size]);
        std::memset(blocks.back(), 1, size);
    }
}

/// Uses 120 MiB, and requests more than there can be.
void eatAndRequest() {
    constexpr std::size_t size = std::size_t{120} << 20;
    char* const block = new char[size];
    std::memset(block, 1, size);
    sink = *new char[std::size_t{1} << 46] + block[size / 2];
}

/// Lies to the host, and waits for its reaction.
void lie(const std::string& bytes) {
    writeToPipes(bytes);
    hang();
}

void writeForever(const std::string& bytes) {
    while (forever)
        writeToPipes(bytes);
}

void reportForever(const std::function<void(QrProcessControl&)>& report) {
    while (forever)
        report(*QrGetProcessController());
}

void throwStandard() {
    throw std::runtime_error("a reason");
}

struct Unknown {};

using Acts = std::map<std::string, std::function<void()>>;

Acts actsThatEnd() {
    return {
        {"crash", crash},
        {"recurse", [] { sink = recurse(0); }},
        {"divide", [] { sink = 12345 / (sink - sink); }},
        {"trap", [] { __builtin_trap(); }},
        {"raiseSegv", [] { std::raise(SIGSEGV); }},
        {"crashInThread", [] { std::thread(crash).join(); }},
        {"killSelf", killSelf},
        {"abort", [] { std::abort(); }},
        {"terminate", [] { std::terminate(); }},
        {"throwInNoexcept", []() noexcept { throwStandard(); }},
        {"throwInThread",
         [] { std::thread([] { throw std::runtime_error("out of a thread"); }).join(); }},
        {"exit", [] { std::exit(0); }},
        {"exitWithStatus", [] { std::exit(7); }},
        {"quickExit", [] { std::_Exit(3); }},
        {"exitAsTheProbe", [] { std::_Exit(217); }},
        {"exitInThread", [] { std::thread([] { std::_Exit(5); }).join(); }},
        {"hang", hang},
        {"sleep", [] { std::this_thread::sleep_for(std::chrono::hours(1)); }},
        {"freeze", freeze},
        {"hangInThread", [] { std::thread(hang).join(); }},
        {"eatMemory", eatMemory},
        {"eatAndRequest", eatAndRequest},
        {"requestTooMuch", [] { sink = *new char[std::size_t{1} << 46]; }},
        {"throwStandard", throwStandard},
        {"throwOwn",
         [] { throw QrStreamEx::ExReadError("tests/guarding/components/acts", __LINE__); }},
        {"throwUnknown", [] { throw Unknown(); }},
        {"throwNumber", [] { throw 42; }},
        {"abortController", [] { QrGetProcessController()->abort(9, L"the importer gives up"); }},
    };
}

Acts actsThatLie() {
    return {
        {"garbage", [] { lie("no frame at all"); }},
        {"garbageForever", [] { writeForever(std::string(4096, 'x')); }},
        {"halfFrame", [] { lie(joined(frame(stageKind, word(0)).substr(0, 9), "xx")); }},
        {"wrongSum",
         [] {
             std::string bytes = frame(stageKind, word(0));
             bytes.back() ^= 1;
             lie(bytes);
         }},
        {"wrongKind", [] { lie(frame(17, "")); }},
        {"taskKind", [] { lie(frame(128, "")); }},
        {"longPayload", [] { lie(frame(stageKind, std::string(std::size_t{2} << 20, 'x'))); }},
        {"hugeLength",
         [] { lie(joined("MZPR\x83\xFF\xFF\xFF\xFF", std::string(std::size_t{2} << 20, 'x'))); }},
        {"longText", [] { lie(frame(stageKind, joined(word(0x40000000), word(65)))); }},
        {"nulInText", [] { lie(frame(stageKind, joined(word(1), word(0)))); }},
        {"wrongFlag", [] { lie(frame(130, "\2\2\2")); }},
        {"unknownFunction", [] { lie(call(99)); }},
        {"verdictOfTheHost", [] { lie(outcome(14)); }},
        {"unknownVerdict", [] { lie(outcome(200)); }},
        {"importedNothing", [] { lie(outcome(0)); }},
        {"importedGarbage",
         [] { lie(joined(frame(objectKind, "garbage, no object"), outcome(0))); }},
        {"importedUnknownClass",
         [] { lie(joined(frame(objectKind, storedCircle(0x49999)), outcome(0))); }},
        {"importedMore",
         [] { lie(joined(frame(objectKind, joined(storedCircle(0x40001), "more")), outcome(0))); }},
        {"importedForged",
         [] { lie(joined(frame(objectKind, storedCircle(0x40001)), outcome(0), "ignored")); }},
        {"hugeAnswer", [] { writeForever(frame(objectKind, std::string(60000, 'x'))); }},
        {"callsWithoutReading",
         [] {
             std::string calls;
             for (int count = 0; count < 100; ++count)
                 calls += call(2);
             writeForever(calls);
         }},
        {"closePipes", closePipes},
        {"closeEverything", closeEverything},
        {"messagesForever",
         [] { reportForever([](QrProcessControl& to) { to.message(1, L"again"); }); }},
        {"warningsForever",
         [] { reportForever([](QrProcessControl& to) { to.warning(1, L"again"); }); }},
        {"searchForever",
         [] { reportForever([](QrProcessControl& to) { to.findFile(L"a", L"b", nullptr); }); }},
        {"progressForever",
         [] { reportForever([](QrProcessControl& to) { to.progress(0.5f, L"again"); }); }},
    };
}

/// A process survives these, and its import succeeds.
Acts actsWithoutHarm() {
    return {
        {"print",
         [] {
             for (int line = 0; line < 5000; ++line)
                 std::cout << "no result\n" << std::flush;
         }},
        {"otherLocale", [] { std::setlocale(LC_ALL, "C"); }},
        {"leaveThread", [] { std::thread(hang).detach(); }},
        {"longMessage",
         [] { QrGetProcessController()->message(1, std::wstring(100000, L'x').c_str()); }},
        {"otherController", [] { QrSetSystemProcessController(nullptr); }},
        {"endParent", [] { endParent(); }},
        {"swallowBadAlloc",
         [] {
             try {
                 sink = *new char[std::size_t{1} << 46];
             } catch (const std::bad_alloc&) {
             }
         }},
    };
}

} // namespace

void perform(const std::string& name) {
    for (const Acts& acts : {actsThatEnd(), actsThatLie(), actsWithoutHarm()})
        if (const auto act = acts.find(name); act != acts.end())
            return act->second();
}

} // namespace Mz::Test
