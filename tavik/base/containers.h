// Hash containers of the platform: Abseil's swiss tables, under the platform's names.
#ifndef TAVIK_BASE_CONTAINERS_H_
#define TAVIK_BASE_CONTAINERS_H_

#include "absl/container/flat_hash_map.h"
#include "absl/container/flat_hash_set.h"
#include "absl/hash/hash.h"

namespace tavik {

// Parameters as Abseil's, so that string keys keep heterogeneous lookup by string_view.
template <typename... Params>
using FlatHashMap = absl::flat_hash_map<Params...>;
template <typename... Params>
using FlatHashSet = absl::flat_hash_set<Params...>;
template <typename T>
using Hash = absl::Hash<T>;

}  // namespace tavik

#endif  // TAVIK_BASE_CONTAINERS_H_
