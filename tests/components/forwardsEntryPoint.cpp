// SPDX-License-Identifier: BSL-1.0
/// Forwards its entry point to another library, see the .def file.
extern "C" int somethingOfItsOwn() {
    return 1;
}
