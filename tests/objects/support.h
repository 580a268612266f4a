/// What the tests of whole objects share: streams over bytes in memory, nodes, and objects whose
/// stored form is made up.
#pragma once

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"
#include "tests/objects/components/classes.h"
#include "tests/support/journal.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <sstream>
#include <string>
#include <string_view>

namespace Mz::Test {

/// Writes objects to memory.
template <class Stream>
struct Saving {
    std::string bytes() const { return sink.str(); }

    std::ostringstream sink;
    QrOutBuffer buffer{&sink};
    QrObjectOutBuffer objects{&buffer};
    Stream stream{&objects};
};

/// Reads objects from memory.
template <class Stream>
struct Loading {
    explicit Loading(std::string_view bytes) : source(std::string(bytes)) {}

    QrRef<QrCastable> object(const QrUid* id = nullptr) {
        return stream.readObject(id, nullptr, nullptr);
    }
    QrPtr<Node> node() { return queryCast<Node>(object(&Node::uid).get()); }
    void finish() {
        QrPostLoadList list;
        stream.transfer(list);
        list.loadFinished();
    }

    std::istringstream source;
    QrInBuffer buffer{&source};
    QrObjectInBuffer objects{&buffer};
    Stream stream{&objects};
};

/// What one object is as bytes.
template <class Stream>
std::string saved(const QrCastable* object) {
    Saving<Stream> out;
    out.stream << object;
    return out.bytes();
}

/// An object that claims to be of any class and writes whatever it is told to. Not counted.
class Scripted final : public QrCastImpl<Scripted, QrPersistant> {
  public:
    Scripted(const QrUid& claimed, unsigned int version, std::function<void(QrStream&)> content)
        : claimedClass(claimed), claimedVersion(version), writeContent(std::move(content)) {}

    const QrUid* getClassUid() const override { return &claimedClass; }
    unsigned int getVersion() const override { return claimedVersion; }
    void write(QrStream& stream) override { writeContent(stream); }
    void read(QrStream&) override { FAIL() << "only builders make objects to read into"; }

  private:
    QrUid claimedClass;
    unsigned int claimedVersion;
    std::function<void(QrStream&)> writeContent;
};

/// The reason of the `ExReadObject` that `work` ends in.
template <class Work>
std::string readFailure(Work&& work) {
    try {
        work();
    } catch (const QrStreamEx::ExReadObject& failure) {
        return failure.getReason();
    }
    ADD_FAILURE() << "there was no failure";
    return {};
}

/// The component manager with the test's classes.
class Objects : public testing::Test {
  protected:
    Objects() { QrGetComponentManager()->initialize(MZ_BUILD_PATH L"/components/objects"); }

    static QrPtr<Node> make(const QrUid& uid) {
        const QrRef<QrCastable> object = QrGetComponentManager()->createObject(uid);
        return QrPtr<Node>::adopt(safeCast<Node>(object.get()));
    }

    static QrPtr<Node> node(int number, std::vector<QrPtr<Node>> links = {}) {
        QrPtr<Node> result = make(nodeUid);
        result->number = number;
        result->name = L"node " + std::to_wstring(number);
        result->flag = number % 2 != 0;
        result->weight = number / 8.0;
        result->links = std::move(links);
        return result;
    }

    /// Nodes of `nodeUid` that exist.
    static int alive() {
        const QrRef<QrCastable> census = QrGetComponentManager()->createObject(censusUid);
        return queryCast<Census>(census.get())->alive();
    }

    /// Undoes the links among all nodes that can be reached: circles never end by themselves.
    static void unlink(const QrPtr<Node>& start) {
        std::vector<QrPtr<Node>> found{start};
        while (!found.empty()) {
            const QrPtr<Node> next = found.back();
            found.pop_back();
            if (!next)
                continue;
            const std::vector<QrPtr<Node>> links = std::exchange(next->links, {});
            found.insert(found.end(), links.begin(), links.end());
        }
    }

    static void expectEqual(const Node& a, const Node& b) {
        EXPECT_EQ(a.number, b.number);
        EXPECT_EQ(a.name, b.name);
        EXPECT_EQ(a.flag, b.flag);
        EXPECT_EQ(a.weight, b.weight);
        EXPECT_EQ(a.links.size(), b.links.size());
    }
};

/// The same for each kind of stream.
template <class Stream>
class ObjectsOn : public Objects {};
using StreamKinds = testing::Types<QrBinaryStream, QrTextStream>;

} // namespace Mz::Test
