// The 25 blocks of this processor generation in their fixed position order, as types and as
// names. Everything that handles every block (the controller's cache, the block factory, tools)
// iterates this one list.
#ifndef TAVIK_IQ_ZEL_ZEL_BLOCK_LIST_H_
#define TAVIK_IQ_ZEL_ZEL_BLOCK_LIST_H_

#include <array>
#include <cstddef>
#include <string_view>
#include <tuple>
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

// Position order.
using ZelBlockTypes = std::tuple<
    vosbrine::zelmondrake::BlcTuning, vosbrine::zelmondrake::CcmTuning,
    vosbrine::zelmondrake::ClutTuning, vosbrine::zelmondrake::DisparityTuning,
    vosbrine::zelmondrake::DmscTuning, vosbrine::zelmondrake::DpcTuning,
    vosbrine::zelmondrake::EdgedetTuning, vosbrine::zelmondrake::GammaTuning,
    vosbrine::zelmondrake::GtnrSharpenerTuning, vosbrine::zelmondrake::GtnrTuning,
    vosbrine::zelmondrake::HqdnsTuning, vosbrine::zelmondrake::LscStatsTuning,
    vosbrine::zelmondrake::LscTuning, vosbrine::zelmondrake::LtmTuning,
    vosbrine::zelmondrake::LtmDeltaYTuning, vosbrine::zelmondrake::NfltrTuning,
    vosbrine::zelmondrake::NsmixTuning, vosbrine::zelmondrake::PrcTuning,
    vosbrine::zelmondrake::RgbYuvConversionTuning, vosbrine::zelmondrake::SensorGammaTuning,
    vosbrine::zelmondrake::SharpTuning, vosbrine::zelmondrake::SkindTuning,
    vosbrine::zelmondrake::SnaddTuning, vosbrine::zelmondrake::StkTuning,
    vosbrine::zelmondrake::WbTuning>;

inline constexpr size_t kZelBlockCount = std::tuple_size_v<ZelBlockTypes>;

namespace zel_block_list_internal {
template <template <typename> class Wrapper, typename Tuple>
struct MapTuple;
template <template <typename> class Wrapper, typename... T>
struct MapTuple<Wrapper, std::tuple<T...>> {
  using type = std::tuple<Wrapper<T>...>;
};
}  // namespace zel_block_list_internal

// std::tuple<Wrapper<Block>...> over the blocks in position order.
template <template <typename> class Wrapper>
using ZelBlockTuple = typename zel_block_list_internal::MapTuple<Wrapper, ZelBlockTypes>::type;

template <size_t Position>
using ZelBlockType = std::tuple_element_t<Position, ZelBlockTypes>;

// Calls `function.template operator()<Position, T>()` for every block, in position order.
template <typename Function>
void ForEachZelBlockType(Function&& function) {
  [&function]<size_t... Positions>(std::index_sequence<Positions...>) {
    (function.template operator()<Positions, ZelBlockType<Positions>>(), ...);
  }(std::make_index_sequence<kZelBlockCount>());
}

// The block names, each its message's short name, in position order.
inline constexpr std::array<std::string_view, kZelBlockCount> kZelBlockNames = {
    "BlcTuning",       "CcmTuning",       "ClutTuning",          "DisparityTuning",
    "DmscTuning",      "DpcTuning",       "EdgedetTuning",       "GammaTuning",
    "GtnrSharpenerTuning", "GtnrTuning",  "HqdnsTuning",         "LscStatsTuning",
    "LscTuning",       "LtmTuning",       "LtmDeltaYTuning",     "NfltrTuning",
    "NsmixTuning",     "PrcTuning",       "RgbYuvConversionTuning", "SensorGammaTuning",
    "SharpTuning",     "SkindTuning",     "SnaddTuning",         "StkTuning",
    "WbTuning"};

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_ZEL_BLOCK_LIST_H_
