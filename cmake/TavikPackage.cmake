# Installation: headers, libraries, the CMake package `tavik` and a pkg-config file.
