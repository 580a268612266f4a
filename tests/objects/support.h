// SPDX-License-Identifier: BSL-1.0
/// The fixture for the tests of whole objects, and objects with made-up content.
#pragma once

#include "tests/objects/objectStreams.h"
#include "tests/streams/streamKinds.h"
#include "tests/support/journal.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <string>

namespace Mz::Test {

/// An object that claims any class and writes any content. Not counted.
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

/// Returns the reason of the `ExReadObject` that `work` throws.
template <class Work>
std::string readFailure(Work&& work) {
    try {
        work();
    } catch (const QrStreamEx::ExReadObject& failure) {
        return failure.getReason();
    }
    ADD_FAILURE() << "ExReadObject was not thrown";
    return {};
}

/// Initialises the manager with the classes of the tests.
class Objects : public testing::Test {
  protected:
    Objects() {
        QrGetComponentManager()->initialize(
            MZ_BUILD_PATH L"/components/objects;" MZ_BUILD_PATH L"/components/objectForms");
    }

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

    /// Returns the number of existing nodes that their classes count.
    static int alive() {
        const QrRef<QrCastable> census = QrGetComponentManager()->createObject(censusUid);
        return queryCast<Census>(census.get())->alive();
    }

    static void expectEqual(const Node& a, const Node& b) {
        EXPECT_EQ(a.number, b.number);
        EXPECT_EQ(a.name, b.name);
        EXPECT_EQ(a.flag, b.flag);
        EXPECT_EQ(a.weight, b.weight);
        EXPECT_EQ(a.links.size(), b.links.size());
    }
};

/// The same fixture for each class of stream.
template <class Stream>
class ObjectsOn : public Objects {};
using StreamKinds = testing::Types<QrBinaryStream, QrTextStream, BaseStream>;

} // namespace Mz::Test
