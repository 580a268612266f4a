// SPDX-License-Identifier: BSL-1.0
/// Its entry point, see the .def file, is another library's.
extern "C" int somethingOfItsOwn() {
    return 1;
}
