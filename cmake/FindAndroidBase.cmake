# Android's libbase and liblog as Debian ships them: headers under include/android, libraries
# under lib/<arch>/android. Defines the imported targets AndroidBase::base and AndroidBase::log.
# Installed with the tavik package, which needs the same targets.

if(NOT TARGET AndroidBase::base)
  find_path(ANDROID_BASE_INCLUDE_DIR android-base/logging.h PATH_SUFFIXES android)
  find_library(ANDROID_BASE_LIBRARY NAMES base PATH_SUFFIXES android)
  find_library(ANDROID_LOG_LIBRARY NAMES log PATH_SUFFIXES android)
  if(NOT ANDROID_BASE_INCLUDE_DIR OR NOT ANDROID_BASE_LIBRARY OR NOT ANDROID_LOG_LIBRARY)
    message(FATAL_ERROR "Android libbase not found: install android-libbase-dev and "
                        "android-liblog-dev (scripts/install-deps.sh)")
  endif()

  add_library(AndroidBase::log SHARED IMPORTED)
  set_target_properties(AndroidBase::log PROPERTIES IMPORTED_LOCATION "${ANDROID_LOG_LIBRARY}")

  add_library(AndroidBase::base SHARED IMPORTED)
  set_target_properties(AndroidBase::base PROPERTIES
    IMPORTED_LOCATION "${ANDROID_BASE_LIBRARY}"
    INTERFACE_INCLUDE_DIRECTORIES "${ANDROID_BASE_INCLUDE_DIR}"
    INTERFACE_LINK_LIBRARIES AndroidBase::log)
  get_filename_component(ANDROID_BASE_LIBRARY_DIR "${ANDROID_BASE_LIBRARY}" DIRECTORY)
endif()
