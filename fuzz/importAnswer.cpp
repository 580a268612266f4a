// SPDX-License-Identifier: BSL-1.0
// Reads what the child process of a guarded import sends, which an importer may have written, and
// loads the object in it.
//
// Input: the size of the pieces in which the rest arrives. If it is odd, the rest is what arrives;
// if it is even, the rest is a sequence of messages.
#include "components/componentManager/componentImp.h"
#include "components/componentTools/guarding/importConversation.h"
#include "components/componentTools/guarding/storedObject.h"
#include "fuzz/frames.h"
#include "tests/guarding/components/parcel.h"

#include <algorithm>
#include <optional>

namespace {

using namespace Mz;
using namespace Mz::Tools;

/// Accepts every call, and checks what it receives.
class CheckingController final : public QrCastImpl<CheckingController, QrProcessControl> {
  public:
    void* getContext() override { return nullptr; }
    void message(int, const wchar_t* text) override { count(text); }
    bool isInterrupted() override { return false; }
    bool warning(int, const wchar_t* text) override { return count(text); }
    bool isProgressShown() override { return true; }
    bool progress(float fraction, const wchar_t* text) override {
        Fuzz::expect(fraction >= 0 && fraction <= 1, "a fraction is between 0 and 1");
        return count(text);
    }
    bool isStatusShown() override { return true; }
    void status(const wchar_t* text) override { count(text); }
    bool error(int, const wchar_t* text) override { return count(text); }
    bool isErrorShown() override { return true; }
    void log(int, const wchar_t* text) override { count(text); }
    [[noreturn]] void abort(int, const wchar_t* text) override {
        count(text);
        throw Aborted();
    }
    std::wstring findFile(const wchar_t* name, const wchar_t*, const wchar_t*) override {
        count(name);
        return name;
    }

    struct Aborted {};
    std::uint64_t calls = 0;

  private:
    bool count(const wchar_t* text) {
        Fuzz::expect(text != nullptr, "a text is not null");
        return ++calls > 0;
    }
};

/// Breaks the circles of parcels; otherwise they leak.
void unlink(const QrPtr<Test::Parcel>& parcel) {
    if (!parcel)
        return;
    const QrPtr<Test::Parcel> first = std::exchange(parcel->first, {});
    const QrPtr<Test::Parcel> second = std::exchange(parcel->second, {});
    unlink(first);
    unlink(second);
}

/// What the messages of a child lead to.
struct Conclusion {
    std::optional<ImportOutcome> outcome; ///< none if the conversation is not over
    std::string object, replies;
    std::wstring activity;
    std::uint64_t calls = 0;
    bool aborted = false;
};

/// Hands over the bytes in pieces of this size.
Conclusion converse(std::string_view bytes, std::size_t piece, const Kit::ImportLimits& limits) {
    CheckingController controller;
    ImportConversation conversation(&controller, limits);
    Conclusion result;
    std::string pending;
    try {
        for (; !conversation.isOver() && !bytes.empty();
             bytes.remove_prefix(std::min(piece, bytes.size()))) {
            pending += bytes.substr(0, piece);
            conversation.receive(pending, result.replies);
        }
    } catch (const CheckingController::Aborted&) {
        result.aborted = true;
    }
    Fuzz::expect(conversation.object.size() <= limits.answer, "the object is within its limit");
    Fuzz::expect(controller.calls <= limits.calls, "the calls are within their limit");
    if (conversation.isOver())
        result.outcome = conversation.outcome();
    result.object = conversation.object;
    result.activity = conversation.activity;
    result.calls = controller.calls;
    return result;
}

void expectSame(const Conclusion& a, const Conclusion& b) {
    Fuzz::expect(a.aborted == b.aborted && a.calls == b.calls, "pieces cause the same calls");
    Fuzz::expect(a.outcome.has_value() == b.outcome.has_value(), "pieces end it at the same place");
    if (a.outcome)
        Fuzz::expect(a.outcome->verdict == b.outcome->verdict &&
                         a.outcome->detail == b.outcome->detail,
                     "pieces have the same outcome");
    Fuzz::expect(a.activity == b.activity, "pieces name the same activity");
    Fuzz::expectSame(a.object, b.object, "pieces make the same object");
    Fuzz::expectSame(a.replies, b.replies, "pieces get the same replies");
}

void expectReadable(const std::string& replies) {
    FrameReader frames(replies);
    while (const std::optional<Frame> frame = frames.next())
        Fuzz::expect(decodeReply(frame->payload).has_value(), "a reply can be read");
    Fuzz::expect(frames.remaining() == 0, "a reply is whole");
}

} // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    QrGetComponentManager()->initialize(MZ_BUILD_PATH L"/components/hostile");
    Kit::ImportLimits limits;
    limits.answer = 2048; // An input can be longer.
    limits.objects = 100;
    limits.calls = 10;
    limits.classes = {Test::parcelUid};
    Fuzz::Input input(data, size);
    const unsigned int first = input.byte();
    const std::string bytes = Fuzz::arriving(input, first % 2 == 0);
    const Conclusion result = converse(bytes, 1 + first * 16, limits);
    expectSame(result, converse(bytes, bytes.size(), limits));
    expectReadable(result.replies);
    if (!result.outcome || result.outcome->verdict != Kit::ImportVerdict::imported)
        return 0;
    QrRef<QrCastable> object;
    const ImportOutcome restored = restoreObject(result.object, limits, object);
    Fuzz::expect(static_cast<bool>(object) == (restored.verdict == Kit::ImportVerdict::imported),
                 "there is an object if it was accepted");
    unlink(queryCast<Test::Parcel>(object.get()));
    return 0;
}
