// SPDX-License-Identifier: BSL-1.0
/// The library does the work. All JSON is written in ASCII.
#include "components/componentTools/records/json.h"

#include <istream>

namespace Mz::Tools {

Json jsonIn(std::string_view text) {
    return Json::parse(text);
}

Json jsonIn(std::istream& input) {
    return Json::parse(input);
}

std::int64_t integerOf(const Json& value) {
    return value.get_ref<const Json::number_integer_t&>();
}

std::string asciiOf(const Json& value) {
    return value.dump(-1, ' ', true, Json::error_handler_t::replace);
}

std::string linesOf(const OrderedJson& value) {
    return value.dump(2, ' ', true) + "\n";
}

} // namespace Mz::Tools
