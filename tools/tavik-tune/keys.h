// The keys of a forest in sort order, with the file that won each.
#ifndef TOOLS_TAVIK_TUNE_KEYS_H_
#define TOOLS_TAVIK_TUNE_KEYS_H_

#include <ostream>
#include <string>
#include <vector>

#include "tavik/base/status.h"

namespace tavik::tune {

// Reads the tuning files of `paths` in the runtime's order and prints "KEY<TAB>FILE" per key,
// sorted as the forest sorts them, with a line for each later file that the key dropped.
// Fails when no file yields a key.
Status RunKeys(const std::vector<std::string>& paths, std::ostream& out);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_KEYS_H_
