# Installation: the libraries, their public headers, and a package for find_package.
include_guard()
