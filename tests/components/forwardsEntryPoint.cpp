/// Its entry point, see the .def file, is another library's.
extern "C" int somethingOfItsOwn() {
    return 1;
}
