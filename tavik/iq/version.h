// The library's own version, for tools and consumers that report what they run on.
#ifndef TAVIK_IQ_VERSION_H_
#define TAVIK_IQ_VERSION_H_

#include <string_view>

#include "tavik/iq/export.h"

namespace tavik {

// "major.minor.patch" of the installed library.
TAVIK_EXPORT std::string_view LibraryVersion();

}  // namespace tavik

#endif  // TAVIK_IQ_VERSION_H_
