#include "tavik/iq/version.h"

namespace tavik {

std::string_view LibraryVersion() { return TAVIK_VERSION; }

}  // namespace tavik
