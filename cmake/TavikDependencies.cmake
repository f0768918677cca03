# Every dependency comes from a Debian package (scripts/install-deps.sh).

find_package(Protobuf REQUIRED)
find_package(absl CONFIG REQUIRED)
find_package(fmt CONFIG REQUIRED)
find_package(Eigen3 CONFIG REQUIRED)
include(FindAndroidBase)
# The tools draw their pictures with PLplot (tavik-tune plot).
find_package(PkgConfig REQUIRED)
pkg_check_modules(PLPLOT REQUIRED IMPORTED_TARGET plplot)

if(TAVIK_BUILD_TESTS)
  find_package(GTest CONFIG REQUIRED)
endif()
if(TAVIK_BUILD_BENCHMARKS)
  find_package(benchmark CONFIG REQUIRED)
endif()
