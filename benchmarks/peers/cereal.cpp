// SPDX-License-Identifier: BSL-1.0
// cereal: its archives on standard streams, the fastest one and the portable one, and objects by
// shared pointers to a polymorphic base, which it tracks.
#include "measure.h"
#include "objects/graph.h"
#include "peers/registration.h"
#include "peers/values.h"

#include <cereal/archives/binary.hpp>
#include <cereal/archives/json.hpp>
#include <cereal/archives/portable_binary.hpp>
#include <cereal/types/memory.hpp>
#include <cereal/types/polymorphic.hpp>
#include <cereal/types/vector.hpp>
#include <fstream>
#include <memory>

namespace Mz::Benchmarks::Cereal {

struct Node {
    virtual ~Node() = default;

    template <class Archive>
    void serialize(Archive&) {}
};

struct StoredNode final : Node {
    int number = 0;
    double value = 0;
    std::shared_ptr<Node> link;

    template <class Archive>
    void serialize(Archive& archive) {
        archive(CEREAL_NVP(number), CEREAL_NVP(value), CEREAL_NVP(link));
    }
};

} // namespace Mz::Benchmarks::Cereal

CEREAL_REGISTER_TYPE_WITH_NAME(Mz::Benchmarks::Cereal::StoredNode, "node")
CEREAL_REGISTER_POLYMORPHIC_RELATION(Mz::Benchmarks::Cereal::Node,
                                     Mz::Benchmarks::Cereal::StoredNode)

namespace Mz::Benchmarks {

namespace {

using Nodes = std::vector<std::shared_ptr<Cereal::Node>>;

const Nodes& nodes() {
    static const Nodes made = [] {
        Nodes result;
        for (const NodeContent& content : graph()) {
            const auto node = std::make_shared<Cereal::StoredNode>();
            node->number = content.number;
            node->value = content.value;
            if (content.link >= 0)
                node->link = result[static_cast<std::size_t>(content.link)];
            result.push_back(node);
        }
        return result;
    }();
    return made;
}

template <class Output>
void save(const std::string& path) {
    std::ofstream file(path, std::ios::binary);
    Output archive(file);
    archive(cereal::make_nvp("nodes", nodes()));
}

template <class Input>
Nodes load(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    Input archive(file);
    Nodes loaded;
    archive(cereal::make_nvp("nodes", loaded));
    return loaded;
}

template <class Input>
bool isSaved(const std::string& path) {
    const Nodes loaded = load<Input>(path);
    return loaded.size() == nodeCount && isGraph([&](std::size_t index) {
               const auto& node = static_cast<const Cereal::StoredNode&>(*loaded[index]);
               const std::ptrdiff_t expected = graph()[index].link;
               const bool right =
                   expected >= 0 && node.link == loaded[static_cast<std::size_t>(expected)];
               return NodeContent{node.number, node.value, !node.link ? -1 : right ? expected : -2};
           });
}

template <class Output, class Input>
void saveObjects(benchmark::State& state) {
    nodes();
    measureSaving(state, save<Output>, isSaved<Input>);
}

template <class Output, class Input>
void loadObjects(benchmark::State& state) {
    nodes();
    measureLoading(state, save<Output>, load<Input>, isSaved<Input>);
}

template <class T, class Output>
void write(benchmark::State& state) {
    writeBinaryOfPeer<T>(state, [](std::ostream& out, const std::vector<T>& values) {
        Output archive(out);
        for (const T value : values)
            (*opaque(&archive))(value);
    });
}

template <class T, class Output>
std::string archived(const std::vector<T>& values) {
    std::ostringstream out;
    Output archive(out);
    for (const T value : values)
        archive(value);
    return out.str();
}

template <class T, class Output, class Input>
void read(benchmark::State& state) {
    const std::string content = archived<T, Output>(randomValues<T>(valueCount));
    readBinaryOfPeer<T>(state, content, [](std::istream& in, std::vector<T>& values) {
        Input archive(in);
        for (T& value : values)
            (*opaque(&archive))(value);
    });
}

template <class T, class Output>
void writeArray(benchmark::State& state) {
    const auto work = [](std::ostream& out, const std::vector<T>& values) {
        Output archive(out);
        archive(values);
    };
    writeBinaryOfPeer<T>(state, work, arrayCount);
}

template <class T, class Output, class Input>
void readArray(benchmark::State& state) {
    std::ostringstream out;
    Output output(out);
    output(randomValues<T>(arrayCount));
    const auto work = [](std::istream& in, std::vector<T>& values) {
        Input archive(in);
        archive(values);
    };
    readBinaryOfPeer<T>(state, out.str(), work, arrayCount);
}

template <class Output, class Input>
void addBinary(RatioTable& table, const std::string& name) {
    table.addPeer("binary/intWrite", name, write<int, Output>);
    table.addPeer("binary/intRead", name, read<int, Output, Input>);
    table.addPeer("binary/doubleWrite", name, write<double, Output>);
    table.addPeer("binary/doubleRead", name, read<double, Output, Input>);
    table.addPeer("binary/intArrayWrite", name, writeArray<int, Output>);
    table.addPeer("binary/intArrayRead", name, readArray<int, Output, Input>);
    table.addPeer("binary/doubleArrayWrite", name, writeArray<double, Output>);
    table.addPeer("binary/doubleArrayRead", name, readArray<double, Output, Input>);
    table.addPeer("objects/save", name, saveObjects<Output, Input>);
    table.addPeer("objects/load", name, loadObjects<Output, Input>);
}

void addPeer(RatioTable& table) {
    addBinary<cereal::BinaryOutputArchive, cereal::BinaryInputArchive>(table, "cereal");
    addBinary<cereal::PortableBinaryOutputArchive, cereal::PortableBinaryInputArchive>(
        table, "cereal (portable)");
    table.addPeer("objects/textSave", "cereal (JSON)",
                  saveObjects<cereal::JSONOutputArchive, cereal::JSONInputArchive>);
    table.addPeer("objects/textLoad", "cereal (JSON)",
                  loadObjects<cereal::JSONOutputArchive, cereal::JSONInputArchive>);
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
