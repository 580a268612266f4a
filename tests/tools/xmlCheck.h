// SPDX-License-Identifier: BSL-1.0
/// A strict check of small XML documents.
#pragma once

#include <cctype>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Test {

/// Checks that a document is well-formed XML without comments, CDATA and a document type.
class XmlCheck {
  public:
    /// Returns the first fault; empty if there is none.
    static std::string faultIn(std::string_view document) { return XmlCheck(document).run(); }

  private:
    explicit XmlCheck(std::string_view document) : rest(document) {}

    std::string run() {
        take("<?xml version=\"1.0\" encoding=\"UTF-8\"?>");
        while (fault.empty() && !rest.empty())
            rest.front() == '<' ? tag() : text(rest.substr(0, rest.find('<')));
        if (fault.empty() && (!open.empty() || roots != 1))
            fault = "not one closed root";
        return fault;
    }

    bool take(std::string_view expected) {
        if (!rest.starts_with(expected))
            return false;
        rest.remove_prefix(expected.size());
        return true;
    }

    void fail(const std::string& why) {
        fault = why + " before: " + std::string(rest.substr(0, 60));
    }

    std::string name() {
        std::size_t end = 0;
        while (end < rest.size() && (std::isalnum(static_cast<unsigned char>(rest[end])) ||
                                     rest[end] == '-' || rest[end] == ':'))
            ++end;
        const std::string result(rest.substr(0, end));
        rest.remove_prefix(end);
        return result;
    }

    /// Checks the content of an element or a value, and removes it.
    void text(std::string_view content) {
        for (std::size_t at = 0; at < content.size(); ++at) {
            const char character = content[at];
            const bool control = static_cast<unsigned char>(character) < 0x20;
            if (character == '<' || (control && character != '\n'))
                return fail("a forbidden character");
            if (character != '&')
                continue;
            const std::string_view entity = content.substr(at, content.find(';', at) - at + 1);
            if (entity != "&amp;" && entity != "&lt;" && entity != "&gt;" && entity != "&quot;" &&
                entity != "&apos;")
                return fail("an unknown entity");
        }
        if (open.empty() && content.find_first_not_of('\n') != std::string_view::npos)
            return fail("text outside the root");
        rest.remove_prefix(content.size());
    }

    void tag() {
        take("<");
        if (take("/")) {
            const std::string closed = name();
            if (open.empty() || open.back() != closed || !take(">"))
                return fail("a wrong end of " + closed);
            return open.pop_back();
        }
        const std::string element = name();
        if (element.empty())
            return fail("a tag without a name");
        roots += open.empty();
        open.push_back(element);
        attributes();
        if (take("/>"))
            open.pop_back();
        else if (!take(">"))
            fail("a tag without an end");
    }

    void attributes() {
        std::vector<std::string> names;
        while (fault.empty() && take(" ")) {
            const std::string attribute = name();
            for (const std::string& other : names)
                if (other == attribute)
                    return fail("an attribute twice");
            names.push_back(attribute);
            if (attribute.empty() || !take("=\""))
                return fail("an attribute without a value");
            const std::size_t end = rest.find('"');
            if (end == std::string_view::npos)
                return fail("a value without an end");
            text(rest.substr(0, end));
            take("\"");
        }
    }

    std::string_view rest;
    std::vector<std::string> open;
    std::string fault;
    int roots = 0;
};

} // namespace Mz::Test
