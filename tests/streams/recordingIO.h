// SPDX-License-Identifier: BSL-1.0
/// A foreign IO that behaves like the library's buffers and records every call.
#pragma once

#include "components/componentManager/bufferio.h"

#include <clocale>
#include <cstdint>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

namespace Mz::Test {

/// Reads and writes string streams. `calls` has each call as text, "name arguments"; `onCall` runs
/// at the start of each call.
class RecordingIO final : public QrCastImpl<RecordingIO, QrBufferedIO, const RecordingIO&> {
  public:
    explicit RecordingIO(const std::string& bytes = {}) : source(bytes) {}

    std::vector<std::string> calls;
    std::function<void()> onCall;
    std::function<QrRef<QrCastable>(QrStream&)> onReadObject;
    std::string written() const { return sink.str(); }

    bool isBufferIgnored() const override { return false; }
    void writeObject(const QrCastable* obj, QrStream&, const wchar_t* a,
                     const wchar_t* b) override {
        note(std::string("writeObject ") + (obj ? "object " : "null ") + name(a) + " " + name(b));
    }
    QrRef<QrCastable> readObject(QrStream& s, const QrUid* id, const wchar_t* a,
                                 const wchar_t* b) override {
        note("readObject " + (id ? std::to_string(id->w0) : "null") + " " + name(a) + " " +
             name(b));
        return onReadObject ? onReadObject(s) : nullptr;
    }
    void write(const void* data, int size) override {
        note("write " + std::to_string(size));
        out.write(data, size);
    }
    void write(char c) override {
        note("write char");
        out.write(c);
    }
    int read(void* data, int size) override {
        note("read " + std::to_string(size));
        return in.read(data, size);
    }
    int read() override {
        note("read byte");
        return in.read();
    }
    void writeEol() override {
        note("writeEol");
        out.writeEol();
    }
    void writeSpace() override {
        note("writeSpace");
        out.writeSpace();
    }
    int writeChar(const wchar_t* s, int count) override {
        note("writeChar wide " + std::to_string(count));
        return out.writeChar(s, count);
    }
    int writeChar(const char* s, int size) override {
        note("writeChar narrow " + std::to_string(size));
        return out.writeChar(s, size);
    }
    void writeChar(wchar_t c) override {
        note("writeChar wide");
        out.writeChar(c);
    }
    void writeChar(char c) override {
        note("writeChar narrow");
        out.writeChar(c);
    }
    void skipWhiteSpace(int count) override {
        note("skipWhiteSpace " + std::to_string(count));
        in.skipWhiteSpace(count);
    }
    int readChar(wchar_t* buf, int size, int count) override {
        note("readChar wide " + std::to_string(size) + " " + std::to_string(count));
        return in.readChar(buf, size, count);
    }
    int readChar(char* buf, int size, int count) override {
        note("readChar narrow " + std::to_string(size) + " " + std::to_string(count));
        return in.readChar(buf, size, count);
    }
    int readChar(wchar_t& c) override {
        note("readChar wide");
        return in.readChar(c);
    }
    int readChar(char& c) override {
        note("readChar narrow");
        return in.readChar(c);
    }
    void ungetc(wchar_t c) override {
        note("ungetc wide " + std::to_string(static_cast<std::uint32_t>(c)));
        in.ungetc(c);
    }
    void ungetc(char c) override {
        note("ungetc narrow");
        in.ungetc(c);
    }
    bool canSeek() const override { return in.canSeek(); }
    int64 seek(int64 offset, int origin) override {
        note("seek " + std::to_string(offset) + " " + std::to_string(origin));
        return in.seek(offset, origin);
    }
    int64 tell() const override {
        note("tell");
        return in.tell();
    }

  private:
    static std::string name(const wchar_t* text) {
        if (!text)
            return "null";
        std::string narrow;
        for (; *text; ++text)
            narrow += static_cast<char>(*text);
        return narrow;
    }
    void note(const std::string& call) const {
        const_cast<RecordingIO*>(this)->calls.push_back(call);
        if (onCall)
            onCall();
    }

    std::istringstream source;
    std::ostringstream sink;
    QrInBuffer in{&source};
    QrOutBuffer out{&sink};
};

} // namespace Mz::Test
