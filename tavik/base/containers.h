// Hash containers of the platform: Abseil's swiss tables, under the platform's names. String keys
// (std::string or std::string_view) hash and compare transparently, so that a map keyed by
// std::string is searched with a std::string_view without a copy. Abseil's own string hashing
// would do the same, but Debian builds it with a string_view type other than std's.
#ifndef TAVIK_BASE_CONTAINERS_H_
#define TAVIK_BASE_CONTAINERS_H_

#include <memory>
#include <string>
#include <string_view>
#include <utility>

#include "absl/container/flat_hash_map.h"
#include "absl/container/flat_hash_set.h"
#include "absl/hash/hash.h"

namespace tavik {

template <typename T>
using Hash = absl::Hash<T>;

struct StringHash {
  using is_transparent = void;
  size_t operator()(std::string_view text) const { return absl::Hash<std::string_view>()(text); }
};

struct StringEq {
  using is_transparent = void;
  bool operator()(std::string_view a, std::string_view b) const { return a == b; }
};

namespace containers_internal {

template <typename Key>
struct HashEq {
  using HashType = absl::Hash<Key>;
  using EqType = std::equal_to<Key>;
};
template <>
struct HashEq<std::string> {
  using HashType = StringHash;
  using EqType = StringEq;
};
template <>
struct HashEq<std::string_view> {
  using HashType = StringHash;
  using EqType = StringEq;
};

}  // namespace containers_internal

template <typename Key, typename Value,
          typename HashType = typename containers_internal::HashEq<Key>::HashType,
          typename EqType = typename containers_internal::HashEq<Key>::EqType>
using FlatHashMap = absl::flat_hash_map<Key, Value, HashType, EqType>;

template <typename Key, typename HashType = typename containers_internal::HashEq<Key>::HashType,
          typename EqType = typename containers_internal::HashEq<Key>::EqType>
using FlatHashSet = absl::flat_hash_set<Key, HashType, EqType>;

}  // namespace tavik

#endif  // TAVIK_BASE_CONTAINERS_H_
