// SPDX-License-Identifier: BSL-1.0
// The forwarding IO: each call reaches the same operation of the inner IO with the same arguments,
// once, and its result comes back.
#include "components/componentManager/binaryStream.h"
#include "components/objectIO/objectIO.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

using namespace Mz;
using testing::ElementsAre;

namespace {

/// Notes each operation with its arguments, and gives each a result that no other has.
class NotingIO final : public QrCastImpl<NotingIO, QrBufferedIO, const NotingIO&> {
  public:
    mutable std::vector<std::string> calls;
    bool answer = true;

    bool isBufferIgnored() const override { return note("isBufferIgnored"), answer; }
    void writeObject(const QrCastable* obj, QrStream& s, const wchar_t* a,
                     const wchar_t* b) override {
        note("writeObject", obj, &s, a, b);
    }
    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override {
        note("readObject", &s, id, a, b);
        return QrRef<QrCastable>(this);
    }
    void write(const void* data, int size) override { note("write bytes", data, size); }
    void write(char c) override { note("write byte", c); }
    int read(void* data, int size) override { return note("read bytes", data, size), 11; }
    int read() override { return note("read byte"), 12; }
    void writeEol() override { note("writeEol"); }
    void writeSpace() override { note("writeSpace"); }
    int writeChar(const wchar_t* s, int count) override {
        return note("writeChar wide text", s, count), 13;
    }
    int writeChar(const char* s, int size) override { return note("writeChar text", s, size), 14; }
    void writeChar(wchar_t c) override { note("writeChar wide", static_cast<int>(c)); }
    void writeChar(char c) override { note("writeChar", c); }
    void skipWhiteSpace(int count) override { note("skipWhiteSpace", count); }
    int readChar(wchar_t* buf, int size, int count) override {
        return note("readChar wide text", buf, size, count), 15;
    }
    int readChar(char* buf, int size, int count) override {
        return note("readChar text", buf, size, count), 16;
    }
    int readChar(wchar_t& c) override { return note("readChar wide", &c), 17; }
    int readChar(char& c) override { return note("readChar", &c), 18; }
    void ungetc(wchar_t c) override { note("ungetc wide", static_cast<int>(c)); }
    void ungetc(char c) override { note("ungetc", c); }
    bool canSeek() const override { return note("canSeek"), answer; }
    int64 seek(int64 offset, int origin) override {
        return note("seek", offset, origin), int64{1} << 40;
    }
    int64 tell() const override { return note("tell"), int64{1} << 41; }

    template <class... Arguments>
    static std::string call(const char* operation, Arguments... arguments) {
        std::ostringstream text;
        text << operation;
        ((text << ' ' << shown(arguments)), ...);
        return text.str();
    }

  private:
    template <class T>
    static T shown(T value) {
        return value;
    }
    /// Pointers are compared, and not what they point to.
    template <class T>
    static const void* shown(T* pointer) {
        return pointer;
    }
    template <class... Arguments>
    void note(const char* operation, Arguments... arguments) const {
        calls.push_back(call(operation, arguments...));
    }
};

class Forwarder final : public QrCastImpl<Forwarder, QrForwardingIO, const Forwarder&> {
  public:
    explicit Forwarder(QrCastable* io) : QrCastImpl(io) {}
    ~Forwarder() override = default;
};

class Forwarding : public testing::Test {
  protected:
    /// Expects that the inner IO received one call since the last question: this one.
    template <class... Arguments>
    void expect(Arguments... arguments) {
        EXPECT_THAT(io.calls, ElementsAre(NotingIO::call(arguments...)));
        io.calls.clear();
    }

    NotingIO io;
    Forwarder forwarder{&io};
    QrBufferedIO& outer = forwarder;
};

TEST_F(Forwarding, PassesBytes) {
    char bytes[4] = {};
    outer.write(bytes, 4);
    expect("write bytes", bytes, 4);
    outer.write('b');
    expect("write byte", 'b');
    EXPECT_EQ(outer.read(bytes, 3), 11);
    expect("read bytes", bytes, 3);
    EXPECT_EQ(outer.read(), 12);
    expect("read byte");
}

TEST_F(Forwarding, PassesWrittenCharacters) {
    outer.writeEol();
    expect("writeEol");
    outer.writeSpace();
    expect("writeSpace");
    const wchar_t wide[] = L"wide";
    EXPECT_EQ(outer.writeChar(wide, 4), 13);
    expect("writeChar wide text", wide, 4);
    const char narrow[] = "narrow";
    EXPECT_EQ(outer.writeChar(narrow, 6), 14);
    expect("writeChar text", narrow, 6);
    outer.writeChar(L'\u4E00');
    expect("writeChar wide", 0x4E00);
    outer.writeChar('c');
    expect("writeChar", 'c');
}

TEST_F(Forwarding, PassesReadCharacters) {
    outer.skipWhiteSpace(7);
    expect("skipWhiteSpace", 7);
    wchar_t wide[4] = {};
    EXPECT_EQ(outer.readChar(wide, 4, 3), 15);
    expect("readChar wide text", wide, 4, 3);
    char narrow[4] = {};
    EXPECT_EQ(outer.readChar(narrow, 4, 2), 16);
    expect("readChar text", narrow, 4, 2);
    EXPECT_EQ(outer.readChar(wide[1]), 17);
    expect("readChar wide", wide + 1);
    EXPECT_EQ(outer.readChar(narrow[1]), 18);
    expect("readChar", narrow + 1);
    outer.ungetc(L'\u4E01');
    expect("ungetc wide", 0x4E01);
    outer.ungetc('u');
    expect("ungetc", 'u');
}

TEST_F(Forwarding, PassesPositions) {
    EXPECT_EQ(outer.seek(int64{-5} << 32, 2), int64{1} << 40);
    expect("seek", int64{-5} << 32, 2);
    EXPECT_EQ(outer.tell(), int64{1} << 41);
    expect("tell");
    for (const bool answer : {true, false}) {
        io.answer = answer;
        EXPECT_EQ(outer.canSeek(), answer);
        expect("canSeek");
        EXPECT_EQ(outer.isBufferIgnored(), answer);
        expect("isBufferIgnored");
    }
}

TEST_F(Forwarding, PassesObjects) {
    QrBinaryStream stream(&io);
    io.calls.clear();
    const wchar_t a[] = L"a", b[] = L"b";
    outer.writeObject(&forwarder, stream, a, b);
    const QrCastable* const object = &forwarder;
    expect("writeObject", object, &stream, a, b);
    const QrUid id{1, 2, 3, 4};
    EXPECT_EQ(outer.readObject(stream, &id, b, a).get(), &io);
    expect("readObject", &stream, &id, b, a);
}

TEST(ForwardingIO, NeedsAnInnerIO) {
    EXPECT_THROW(Forwarder(nullptr), QrComponentManagerEx::ExBadCast);
}

} // namespace
