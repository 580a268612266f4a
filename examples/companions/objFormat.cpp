// SPDX-License-Identifier: BSL-1.0
/// Reads statement by statement; a statement is a line of words. Faces are counted and their
/// indices checked, not stored: the example is about files. A material is found by its name when
/// its first face is read, so that materials of a library that comes later are not used, as the
/// format says.
#include "objFormat.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <optional>
#include <sstream>
#include <string_view>

namespace {

/// The statements that are skipped.
constexpr std::array<std::string_view, 5> skipped{"o", "g", "s", "vt", "vn"};

/// A statement: its line, its keyword, and the words after that.
struct Statement {
    std::size_t line = 0;
    std::string keyword;
    std::string rest;

    /// Returns the rest as words.
    std::vector<std::string> words() const {
        std::vector<std::string> all;
        std::istringstream in(rest);
        for (std::string word; in >> word;)
            all.push_back(word);
        return all;
    }

    /// Returns the first three words as numbers.
    std::array<float, 3> numbers() const {
        const std::vector<std::string> all = words();
        std::array<float, 3> values{};
        for (std::size_t index = 0; index < values.size(); ++index) {
            const char* const begin = index < all.size() ? all[index].data() : nullptr;
            const char* const end = begin ? begin + all[index].size() : nullptr;
            const auto [last, error] = std::from_chars(begin, end, values[index]);
            if (!begin || error != std::errc() || last != end)
                throw ObjError(line, "\"" + keyword + "\" needs three numbers");
        }
        return values;
    }
};

/// Reads the next statement into `statement`. Returns false at the end.
bool nextStatement(std::istream& in, Statement& statement) {
    for (std::string line; std::getline(in, line);) {
        ++statement.line;
        std::istringstream words(line.substr(0, line.find('#')));
        if (!(words >> statement.keyword))
            continue;
        std::getline(words >> std::ws, statement.rest);
        statement.rest.erase(statement.rest.find_last_not_of(" \t\r") + 1);
        return true;
    }
    return false;
}

std::optional<std::size_t> indexOf(const std::vector<Model::Material>& all, std::string_view name) {
    const auto found = std::find_if(all.begin(), all.end(),
                                    [&](const auto& material) { return material.name == name; });
    if (found == all.end())
        return std::nullopt;
    return static_cast<std::size_t>(found - all.begin());
}

/// Checks the vertices of a face, of which each has one of the forms 1, 1/2, 1//3 and 1/2/3.
void checkFace(const Statement& face, std::size_t vertices) {
    const std::vector<std::string> corners = face.words();
    if (corners.size() < 3)
        throw ObjError(face.line, "a face needs three corners");
    for (const std::string& corner : corners) {
        long long index = 0;
        std::from_chars(corner.data(), corner.data() + corner.size(), index);
        const auto distance = static_cast<std::size_t>(index < 0 ? -(index + 1) : index - 1);
        if (index == 0 || distance >= vertices)
            throw ObjError(face.line, "there is no vertex \"" + corner + "\"");
    }
}

} // namespace

bool looksLikeObj(std::istream& in) {
    Statement first;
    if (!nextStatement(in, first))
        return false;
    const std::string& word = first.keyword;
    return word == "v" || word == "mtllib" || std::ranges::find(skipped, word) != skipped.end();
}

ObjData readObj(std::istream& in, const MaterialSource& library) {
    ObjData data;
    std::vector<Model::Material> known;
    std::string current = "(none)";
    for (Statement statement; nextStatement(in, statement);) {
        if (statement.keyword == "v") {
            statement.numbers();
            ++data.vertices;
        } else if (statement.keyword == "f") {
            checkFace(statement, data.vertices);
            std::optional<std::size_t> used = indexOf(data.materials, current);
            if (!used) {
                const std::optional<std::size_t> defined = indexOf(known, current);
                data.materials.push_back(defined ? known[*defined] : Model::Material{current});
                used = data.materials.size() - 1;
            }
            ++data.materials[*used].faces;
        } else if (statement.keyword == "usemtl") {
            current = statement.rest;
        } else if (statement.keyword == "mtllib") {
            const std::vector<Model::Material> defined = library(statement.rest);
            known.insert(known.end(), defined.begin(), defined.end());
        } else if (std::ranges::find(skipped, statement.keyword) == skipped.end()) {
            throw ObjError(statement.line, "unknown statement \"" + statement.keyword + "\"");
        }
    }
    return data;
}

std::vector<Model::Material> readMtl(std::istream& in) {
    std::vector<Model::Material> all;
    for (Statement statement; nextStatement(in, statement);) {
        if (statement.keyword == "newmtl") {
            all.push_back({statement.rest});
        } else if (statement.keyword == "Kd") { // the diffuse colour; others do not count here
            if (all.empty())
                throw ObjError(statement.line, "a colour before the first material");
            const auto [red, green, blue] = statement.numbers();
            all.back() = {all.back().name, red, green, blue, 0};
        }
    }
    return all;
}
