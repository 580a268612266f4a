// SPDX-License-Identifier: BSL-1.0
/// Tests the messages between the processes of a guarded import, and the state that they lead to.
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/guarding/importConversation.h"
#include "components/componentTools/guarding/storedObject.h"
#include "components/componentTools/probing/frames.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <limits>
#include <optional>
#include <string>
#include <type_traits>

using namespace Mz;
using namespace Mz::Tools;
using Kit::ImportVerdict;
using ::testing::AllOf;
using ::testing::HasSubstr;

namespace {

/// Returns the payload of a message that is one frame.
std::string payloadOf(const std::string& message) {
    FrameReader frames(message);
    const std::optional<Frame> frame = frames.next();
    EXPECT_TRUE(frame && frames.remaining() == 0);
    return frame ? std::string(frame->payload) : std::string();
}

TEST(ImportMessages, ArriveAsTheyWereSent) {
    ImportTask task{"list\0data", L"path \x20AC", "C.UTF-8", L"file", L"name", 7, 8,
                    true,         false,          true};
    const auto again = decodeTask(payloadOf(encode(task)));
    ASSERT_TRUE(again);
    EXPECT_EQ(encode(*again), encode(task));
    EXPECT_EQ(again->searchPath, task.searchPath);
    EXPECT_EQ(again->answer, 8u);
    EXPECT_TRUE(again->errorShown);

    ControllerCall call{ControllerFunction::findFile, -3, 0.5f, L"name", L"path", std::nullopt};
    const auto sameCall = decodeCall(payloadOf(encode(call)));
    ASSERT_TRUE(sameCall);
    EXPECT_EQ(sameCall->code, -3);
    EXPECT_EQ(sameCall->fraction, 0.5f);
    EXPECT_EQ(sameCall->searchPath, std::optional<std::wstring>(L"path"));
    EXPECT_FALSE(sameCall->fallbackSearchPath);

    const auto outcome =
        decodeOutcome(payloadOf(encode(ImportOutcome{ImportVerdict::threw, L"why"})));
    ASSERT_TRUE(outcome);
    EXPECT_EQ(outcome->verdict, ImportVerdict::threw);
    EXPECT_EQ(outcome->detail, L"why");
    EXPECT_FALSE(decodeOutcome(payloadOf(encode(ImportOutcome{ImportVerdict::timedOut, L"60"}))));
}

TEST(ImportMessages, AreRejectedWhenCutOrExtended) {
    const std::string payload =
        payloadOf(encode(ControllerCall{ControllerFunction::warning, 1, 0, L"text", {}, L"x"}));
    ASSERT_TRUE(decodeCall(payload));
    EXPECT_FALSE(decodeCall(payload + '\0'));
    for (std::size_t size = 0; size < payload.size(); ++size)
        EXPECT_FALSE(decodeCall(payload.substr(0, size))) << size;
}

TEST(ImportMessages, OfATaskAreRejectedWhenCut) {
    const std::string payload = payloadOf(
        encode(ImportTask{"list", L"path", "C", L"file", L"name", 7, 8, true, true, true}));
    ASSERT_TRUE(decodeTask(payload));
    for (std::size_t size = 0; size < payload.size(); ++size)
        EXPECT_FALSE(decodeTask(payload.substr(0, size))) << size;
}

TEST(ImportConversation, KeepsToItsLimits) {
    Kit::ImportLimits limits;
    limits.answer = 10;
    limits.calls = 2;
    std::string replies;
    {
        ImportConversation conversation(nullptr, limits);
        std::string bytes = encodePiece("123456") + encodePiece("7890");
        conversation.receive(bytes, replies);
        EXPECT_FALSE(conversation.isOver());
        EXPECT_EQ(conversation.object, "1234567890");
        EXPECT_EQ(bytes, "");
        bytes = encodePiece("1");
        conversation.receive(bytes, replies);
        EXPECT_EQ(conversation.outcome().verdict, ImportVerdict::answerTooLong);
    }
    ImportConversation conversation(nullptr, limits);
    const std::string call = encode(ControllerCall{});
    std::string bytes = call + call;
    conversation.receive(bytes, replies);
    EXPECT_FALSE(conversation.isOver());
    bytes = call;
    conversation.receive(bytes, replies);
    EXPECT_EQ(conversation.outcome().verdict, ImportVerdict::tooManyCalls);
    EXPECT_EQ(replies, "");
}

TEST(ImportConversation, WaitsForTheRestOfAMessage) {
    const Kit::ImportLimits limits;
    ImportConversation conversation(nullptr, limits);
    const std::string message =
        encodeActivity(L"the import") + encode(ImportOutcome{ImportVerdict::notTaken, {}});
    std::string bytes, replies;
    for (const char byte : message) {
        EXPECT_FALSE(conversation.isOver());
        bytes += byte;
        conversation.receive(bytes, replies);
    }
    EXPECT_TRUE(conversation.isOver());
    EXPECT_EQ(conversation.activity, L"the import");
    EXPECT_EQ(conversation.outcome().verdict, ImportVerdict::notTaken);
}

TEST(ImportConversation, EndsAtTextsAndMessagesThatAreTooLong) {
    const Kit::ImportLimits limits;
    const std::wstring longest(longestText, L'x'), tooLong = longest + L'x';
    const auto verdictOn = [&](std::string bytes) -> std::optional<ImportVerdict> {
        ImportConversation conversation(nullptr, limits);
        std::string replies;
        conversation.receive(bytes, replies);
        if (!conversation.isOver())
            return std::nullopt;
        return conversation.outcome().verdict;
    };
    EXPECT_EQ(verdictOn(encodeActivity(longest)), std::nullopt);
    EXPECT_EQ(verdictOn(encodeActivity(tooLong)), ImportVerdict::garbled);
    EXPECT_EQ(verdictOn(encode(ImportOutcome{ImportVerdict::threw, longest})),
              ImportVerdict::threw);
    EXPECT_EQ(verdictOn(encode(ImportOutcome{ImportVerdict::threw, tooLong})),
              ImportVerdict::garbled);
    const auto object = static_cast<unsigned char>(ImportKind::object);
    EXPECT_EQ(verdictOn(frameOf(object, std::string(largestPayload, 'x'))), std::nullopt);
    EXPECT_EQ(verdictOn(frameOf(object, std::string(largestPayload + 1, 'x'))),
              ImportVerdict::garbled);
}

TEST(ImportMessages, OfNoCharacterAreRejected) {
    if constexpr (std::is_unsigned_v<wchar_t> && sizeof(wchar_t) == 4)
        GTEST_SKIP() << "every number of 32 bits is a wchar_t";
    std::string payload = payloadOf(encodeActivity(L"a"));
    ASSERT_EQ(decodeActivity(payload), std::optional<std::wstring>(L"a"));
    payload.replace(4, 4, "\xFF\xFF\xFF\xFF");
    EXPECT_EQ(decodeActivity(payload), std::nullopt);
}

/// Stores itself as the test says.
class Storing final : public QrCastImpl<Storing, QrPersistant> {
  public:
    explicit Storing(std::function<void(QrStream&)> written) : action(std::move(written)) {}
    const QrUid* getClassUid() const override { return &classUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { action(stream); }
    void read(QrStream&) override {}

  private:
    static constexpr QrUid classUid{1, 2, 3, 4};
    std::function<void(QrStream&)> action;
};

/// Does not store itself.
class Fleeting final : public QrCastImpl<Fleeting, QrImportBuilder> {
  public:
    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>&) const override { return {}; }
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return false;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
};

TEST(StoredObjects, AreRefusedIfTheyCannotComeBack) {
    std::string bytes;
    const Fleeting fleeting;
    const ImportOutcome notPersistent = storeObject(&fleeting, bytes);
    EXPECT_EQ(notPersistent.verdict, ImportVerdict::notPersistent);
    EXPECT_THAT(toUtf8(notPersistent.detail), HasSubstr("Fleeting"));
    const Storing unknown([](QrStream&) {});
    const ImportOutcome unknownClass = storeObject(&unknown, bytes);
    EXPECT_EQ(unknownClass.verdict, ImportVerdict::unknownClass);
    EXPECT_THAT(toUtf8(unknownClass.detail),
                AllOf(HasSubstr("Storing"), HasSubstr(" (00000001-00000002-00000003-00000004)")));
    EXPECT_EQ(bytes, "");
    EXPECT_EQ(storeObject(nullptr, bytes).verdict, ImportVerdict::imported);
    QrRef<QrCastable> object;
    EXPECT_EQ(restoreObject(bytes, {}, object).detail,
              L"there is no object: Error loading object.");
    EXPECT_EQ(restoreObject("", {}, object).verdict, ImportVerdict::answerRejected);
}

TEST(ImportConversation, EndsWhenTheImporterGivesUp) {
    const Kit::ImportLimits limits;
    ImportConversation conversation(nullptr, limits);
    std::string replies,
        bytes =
            encode(ControllerCall{ControllerFunction::abort, 9, 0, L"no more", std::nullopt, {}});
    conversation.receive(bytes, replies);
    EXPECT_TRUE(conversation.isOver());
    EXPECT_EQ(conversation.outcome().verdict, ImportVerdict::programAborted);
    EXPECT_EQ(conversation.outcome().detail, L"no more");
}

/// Stores the last progress, and finds each file under a long name.
class Progress final : public QrCastImpl<Progress, QrProcessControl> {
  public:
    void* getContext() override { return nullptr; }
    void message(int, const wchar_t*) override {}
    bool isInterrupted() override { return false; }
    bool warning(int, const wchar_t*) override { return true; }
    bool isProgressShown() override { return true; }
    bool progress(float fraction, const wchar_t*) override {
        last = fraction;
        return true;
    }
    bool isStatusShown() override { return false; }
    void status(const wchar_t*) override {}
    bool error(int, const wchar_t*) override { return false; }
    bool isErrorShown() override { return false; }
    void log(int, const wchar_t*) override {}
    [[noreturn]] void abort(int, const wchar_t*) override { throw 1; }
    std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override {
        return std::wstring(std::size_t{600'000}, L'x');
    }

    float last = -1;
};

TEST(ImportConversation, RelaysSoundFractionsOnly) {
    const Kit::ImportLimits limits;
    Progress progress;
    ImportConversation conversation(&progress, limits);
    std::string replies;
    const auto relayed = [&](float fraction) {
        std::string bytes =
            encode(ControllerCall{ControllerFunction::progress, 0, fraction, L"", {}, {}});
        conversation.receive(bytes, replies);
        return progress.last;
    };
    EXPECT_EQ(relayed(0.25f), 0.25f);
    EXPECT_EQ(relayed(7), 1);
    EXPECT_EQ(relayed(-1), 0);
    EXPECT_EQ(relayed(std::numeric_limits<float>::quiet_NaN()), 0);
    FrameReader frames(replies);
    int count = 0;
    for (; frames.next(); ++count)
        continue;
    EXPECT_EQ(count, 4);
}

TEST(ImportConversation, EndsWhenTheChildDoesNotReadItsReplies) {
    const Kit::ImportLimits limits;
    Progress controller;
    ImportConversation conversation(&controller, limits);
    std::string replies;
    const auto ask = [&] {
        std::string bytes =
            encode(ControllerCall{ControllerFunction::findFile, 0, 0, L"name", std::nullopt, {}});
        conversation.receive(bytes, replies);
    };
    ask();
    EXPECT_FALSE(conversation.isOver());
    ask(); // More than 4 MiB wait now.
    EXPECT_TRUE(conversation.isOver());
    EXPECT_EQ(conversation.outcome().verdict, ImportVerdict::garbled);
}

} // namespace
