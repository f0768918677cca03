// The 25 blocks of this processor generation in their fixed position order: their types, names
// and bypass bits, all from one list. Everything that handles every block (the controller's
// cache, the block factory, the translator table, tools) iterates it.
#ifndef TAVIK_IQ_ZEL_ZEL_BLOCK_LIST_H_
#define TAVIK_IQ_ZEL_ZEL_BLOCK_LIST_H_

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <tuple>
#include <type_traits>
#include <utility>

#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/disparity_param.pb.h"
#include "tavik/iq/zel/protos/dmsc_param.pb.h"
#include "tavik/iq/zel/protos/dpc_param.pb.h"
#include "tavik/iq/zel/protos/edgedet_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_sharpener_param.pb.h"
#include "tavik/iq/zel/protos/hqdns_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/lsc_stats_param.pb.h"
#include "tavik/iq/zel/protos/ltm_delta_y_param.pb.h"
#include "tavik/iq/zel/protos/ltm_param.pb.h"
#include "tavik/iq/zel/protos/nfltr_param.pb.h"
#include "tavik/iq/zel/protos/nsmix_param.pb.h"
#include "tavik/iq/zel/protos/prc_param.pb.h"
#include "tavik/iq/zel/protos/rgb_yuv_conversion_param.pb.h"
#include "tavik/iq/zel/protos/sensor_gamma_param.pb.h"
#include "tavik/iq/zel/protos/sharp_param.pb.h"
#include "tavik/iq/zel/protos/skind_param.pb.h"
#include "tavik/iq/zel/protos/snadd_param.pb.h"
#include "tavik/iq/zel/protos/stk_param.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace tavik {

// The one list of blocks, in position order: each block's tuning message and its bit in a frame's
// bypass mask (0: the block has none and can't be bypassed). The mask's bits are the service's
// own numbering, which is not the position order (LscTuning's bit comes before LscStatsTuning's).
#define TAVIK_ZEL_BLOCKS(X)          \
  X(BlcTuning, 0x1)                  \
  X(CcmTuning, 0x2)                  \
  X(ClutTuning, 0x4)                 \
  X(DisparityTuning, 0x8)            \
  X(DmscTuning, 0x10)                \
  X(DpcTuning, 0x20)                 \
  X(EdgedetTuning, 0x40)             \
  X(GammaTuning, 0x80)               \
  X(GtnrSharpenerTuning, 0x100)      \
  X(GtnrTuning, 0x200)               \
  X(HqdnsTuning, 0x400)              \
  X(LscStatsTuning, 0x1000)          \
  X(LscTuning, 0x800)                \
  X(LtmTuning, 0x2000)               \
  X(LtmDeltaYTuning, 0x4000)         \
  X(NfltrTuning, 0x8000)             \
  X(NsmixTuning, 0x10000)            \
  X(PrcTuning, 0x20000)              \
  X(RgbYuvConversionTuning, 0x40000) \
  X(SensorGammaTuning, 0x0)          \
  X(SharpTuning, 0x80000)            \
  X(SkindTuning, 0x100000)           \
  X(SnaddTuning, 0x200000)           \
  X(StkTuning, 0x400000)             \
  X(WbTuning, 0x800000)

namespace zel_block_list_internal {
#define TAVIK_ZEL_BLOCK_TYPE_(Type, bit) , vosbrine::zelmondrake::Type
// The leading void keeps the list's commas uniform; it is dropped below.
template <typename First, typename... Rest>
struct DropFirst {
  using type = std::tuple<Rest...>;
};
using TypesWithVoid = DropFirst<void TAVIK_ZEL_BLOCKS(TAVIK_ZEL_BLOCK_TYPE_)>;
#undef TAVIK_ZEL_BLOCK_TYPE_
}  // namespace zel_block_list_internal

// Position order.
using ZelBlockTypes = zel_block_list_internal::TypesWithVoid::type;

inline constexpr size_t kZelBlockCount = std::tuple_size_v<ZelBlockTypes>;

namespace zel_block_list_internal {
template <template <typename> class Wrapper, typename Tuple>
struct MapTuple;
template <template <typename> class Wrapper, typename... T>
struct MapTuple<Wrapper, std::tuple<T...>> {
  using type = std::tuple<Wrapper<T>...>;
};

template <typename T, typename Tuple>
struct PositionOf;
template <typename T, typename... Types>
struct PositionOf<T, std::tuple<Types...>> {
  static constexpr size_t Find() {
    constexpr bool kMatches[] = {std::is_same_v<T, Types>...};
    for (size_t i = 0; i < sizeof...(Types); ++i) {
      if (kMatches[i]) return i;
    }
    return sizeof...(Types);
  }
  static constexpr size_t value = Find();
  static_assert(value < sizeof...(Types), "not a block of the list");
};
}  // namespace zel_block_list_internal

// std::tuple<Wrapper<Block>...> over the blocks in position order.
template <template <typename> class Wrapper>
using ZelBlockTuple = typename zel_block_list_internal::MapTuple<Wrapper, ZelBlockTypes>::type;

template <size_t Position>
using ZelBlockType = std::tuple_element_t<Position, ZelBlockTypes>;

// The position of block type T.
template <typename T>
inline constexpr size_t kZelBlockPosition =
    zel_block_list_internal::PositionOf<T, ZelBlockTypes>::value;

// Calls `function.template operator()<Position, T>()` for every block, in position order.
template <typename Function>
void ForEachZelBlockType(Function&& function) {
  [&function]<size_t... Positions>(std::index_sequence<Positions...>) {
    (function.template operator()<Positions, ZelBlockType<Positions>>(), ...);
  }
  (std::make_index_sequence<kZelBlockCount>());
}

// The block names, each its message's short name, in position order.
inline constexpr std::array<std::string_view, kZelBlockCount> kZelBlockNames = {
#define TAVIK_ZEL_BLOCK_NAME_(Type, bit) #Type,
    TAVIK_ZEL_BLOCKS(TAVIK_ZEL_BLOCK_NAME_)
#undef TAVIK_ZEL_BLOCK_NAME_
};

// Each block's bit in a frame's bypass mask, in position order; 0 where it has none.
inline constexpr std::array<uint32_t, kZelBlockCount> kZelBlockBypassBits = {
#define TAVIK_ZEL_BLOCK_BYPASS_BIT_(Type, bit) bit,
    TAVIK_ZEL_BLOCKS(TAVIK_ZEL_BLOCK_BYPASS_BIT_)
#undef TAVIK_ZEL_BLOCK_BYPASS_BIT_
};

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_ZEL_BLOCK_LIST_H_
