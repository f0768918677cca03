#include "tavik/iq/zel/zel_tuning_controller.h"

#include <pthread.h>
#include <sched.h>
#include <sys/resource.h>
#include <unistd.h>

#include <array>
#include <cstring>
#include <optional>
#include <tuple>
#include <typeinfo>
#include <utility>

#include "tavik/base/logging.h"
#include "tavik/base/recycling_pool.h"
#include "tavik/base/strings.h"
#include "tavik/base/system_properties.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/sensor_eeprom_data.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_controller_util.h"

namespace tavik {
namespace {

constexpr char kInstanceName[] = "zel-tuning-controller";
constexpr char kEnableSensorBringupTuningProperty[] =
    "vendor.camera.debug.enable_sensor_bringup_tuning";
constexpr char kDumpSensorEepromDataProperty[] = "vendor.camera.debug.dump_sensor_eeprom_data";
constexpr int kWarningPeriodSeconds = 5;
// Bundles and blocks in flight at once: the frames that the pipeline holds, and a few more. Beyond
// these, idle ones are freed rather than kept.
constexpr size_t kIdleBundles = 32;
constexpr size_t kIdleBlocksPerPosition = 8;
// The signal thread runs in the normal scheduling class, niced up so that fences fire promptly.
constexpr int kSignalThreadNice = -10;

vosbrine::TuningUsecase DefaultTuningUsecase() {
  vosbrine::TuningUsecase usecase;
  usecase.set_camera_sensor(vosbrine::BRIMAL_SENSOR_BRINGUP);
  usecase.set_sensor_mode(vosbrine::FULL_4_3_FULL_15_30FPS);
  usecase.set_camera_usecase(vosbrine::VIEWFINDER);
  return usecase;
}

std::string UsecaseText(const vosbrine::TuningUsecase& usecase) {
  return StrCat(vosbrine::CameraSensor_Name(usecase.camera_sensor()), ", ",
                vosbrine::SensorMode_Name(usecase.sensor_mode()), ", ",
                vosbrine::CameraUsecase_Name(usecase.camera_usecase()));
}

// Block name to position. "SensorGammaTuning" deliberately leads to the position of
// "SharpTuning": a request for it yields a SharpTuning block, and no SensorGammaTuning block is
// ever produced by the controller.
FlatHashMap<std::string_view, int> BuildBlockNameIndex() {
  FlatHashMap<std::string_view, int> index;
  for (size_t position = 0; position < kZelBlockNames.size(); ++position) {
    index[kZelBlockNames[position]] = static_cast<int>(position);
  }
  index["SensorGammaTuning"] =
      static_cast<int>(kZelBlockPosition<vosbrine::zelmondrake::SharpTuning>);
  return index;
}

// The fields of two points that name the use case, as opposed to the camera state.
bool UseCaseFieldsDiffer(const ZelTuningPoint& a, const ZelTuningPoint& b) {
  const TuningSensorModeInfo& mode_a = a.tuning_info.sensor_mode_info;
  const TuningSensorModeInfo& mode_b = b.tuning_info.sensor_mode_info;
  return !(a.use_case == b.use_case) || a.tuning_info.image_size != b.tuning_info.image_size ||
         !(a.tuning_info.module_spec == b.tuning_info.module_spec) ||
         mode_a.sensor_fps_range != mode_b.sensor_fps_range ||
         mode_a.target_fps_range != mode_b.target_fps_range;
}

// The fields of two points that the use-case mapping reads (and a few it doesn't, which costs only
// a mapping now and then).
bool MappingInputsEqual(const ZelTuningPoint& a, const ZelTuningPoint& b) {
  const TuningSensorModeInfo& mode_a = a.tuning_info.sensor_mode_info;
  const TuningSensorModeInfo& mode_b = b.tuning_info.sensor_mode_info;
  return a.use_bringup_tuning == b.use_bringup_tuning && a.use_case == b.use_case &&
         mode_a.sensor_name == mode_b.sensor_name && mode_a.mode_width == mode_b.mode_width &&
         mode_a.mode_height == mode_b.mode_height && mode_a.binning_x == mode_b.binning_x &&
         mode_a.binning_y == mode_b.binning_y &&
         mode_a.sensor_fps_range == mode_b.sensor_fps_range &&
         mode_a.target_fps_range == mode_b.target_fps_range &&
         a.tuning_info.image_size == b.tuning_info.image_size &&
         a.tuning_info.module_spec == b.tuning_info.module_spec;
}

// A ZelTuningPoint, or null for a point of another class. The exact class is told apart by its
// type alone, which is much cheaper than a cast through the hierarchy.
const ZelTuningPoint* AsZelTuningPoint(const TuningPoint& point) {
  if (typeid(point) == typeid(ZelTuningPoint)) return static_cast<const ZelTuningPoint*>(&point);
  return dynamic_cast<const ZelTuningPoint*>(&point);
}

// With `!=` on each value, so that a NaN coordinate always counts as changed.
bool CoordinatesDiffer(const TuningCoordinates& a, const TuningCoordinates& b) {
  return a.led_influence != b.led_influence || a.cct != b.cct || a.bv != b.bv ||
         a.real_gain != b.real_gain || a.exp_ratio != b.exp_ratio || a.mired_cct != b.mired_cct ||
         a.scaler_ratio != b.scaler_ratio || a.pre_scaler_ratio != b.pre_scaler_ratio ||
         a.frame_count != b.frame_count || a.exposure_time_msecs != b.exposure_time_msecs;
}

}  // namespace

template <typename T>
using SharedBlock = std::shared_ptr<const ZelTuningBlock<T>>;

// Blocks of one position come back here when the last bundle holding them goes, and are filled
// again over the storage they kept.
template <typename T>
struct BlockPool : RecyclingPool<ZelTuningBlock<T>> {
  BlockPool() : RecyclingPool<ZelTuningBlock<T>>(kIdleBlocksPerPosition) {}
};

// What a frame's blocks are made from: the use case and, once a block needs it, its tree set.
struct ZelTuningController::FrameTuning {
  vosbrine::TuningUsecase usecase;
  const PreparedTreeSet* tree_set = nullptr;
};

// The latest block of each position, and a copy of the point it was made for; the storage that
// frames reuse; and the last frame's use case.
struct ZelTuningController::BlockCache {
  BlockCache() {
    ForEachZelBlockType([this]<size_t Position, typename T>() {
      fields[Position].emplace(T::descriptor(), vosbrine::zelmondrake::TuningTreeSet::descriptor());
    });
  }

  ZelBlockTuple<SharedBlock> blocks;
  std::array<std::unique_ptr<ZelTuningPoint>, kZelBlockCount> points;

  ZelBlockTuple<BlockPool> block_pools;
  RecyclingPool<ZelTuningBundle> bundles{kIdleBundles,
                                         [](ZelTuningBundle& bundle) { bundle.ReleaseBlocks(); }};
  std::array<std::optional<vosbrine::SubBlockFields>, kZelBlockCount> fields;

  // The last point whose use case mapped as it stands, and what it mapped to.
  std::mutex frame_mutex;
  std::unique_ptr<ZelTuningPoint> frame_point;
  FrameTuning frame_tuning;
};

bool IsSubBlockBypassed(uint32_t bypass_bitmask, std::string_view block_name) {
  static const auto* const bits = [] {
    auto* bits = new FlatHashMap<std::string_view, uint32_t>();
    for (size_t position = 0; position < kZelBlockCount; ++position) {
      if (kZelBlockBypassBits[position] != 0) {
        (*bits)[kZelBlockNames[position]] = kZelBlockBypassBits[position];
      }
    }
    return bits;
  }();
  const auto bit = bits->find(block_name);
  return bit != bits->end() && (bypass_bitmask & bit->second) != 0;
}

bool GetBooleanSystemProperty(std::string_view name, bool default_value) {
  StatusOr<bool> value = SystemProperties::GetInstance().GetAs<bool>(name);
  return value.ok() ? *value : default_value;
}

ZelTuningController::ZelTuningController(
    std::string_view device_name, const std::vector<std::string>& paths,
    const FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>& calibration)
    : device_name_(device_name),
      block_cache_(std::make_unique<BlockCache>()),
      block_name_index_(BuildBlockNameIndex()),
      use_bringup_tuning_(GetBooleanSystemProperty(kEnableSensorBringupTuningProperty, false)) {
  const bool dump = GetBooleanSystemProperty(kDumpSensorEepromDataProperty, false);
  // Calibration is spent at load: the map goes when the forest has been built.
  std::shared_ptr<vosbrine::SensorEepromDataMap> eeprom_data =
      BuildTuningEepromData(device_name_, calibration, dump);
  StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> provider =
      vosbrine::zelmondrake::TuningProvider::Create(paths, eeprom_data.get());
  if (provider.ok()) provider_ = std::move(*provider);
}

ZelTuningController::~ZelTuningController() = default;

std::string ZelTuningController::GetInstanceName() const { return kInstanceName; }

std::shared_ptr<TuningPoint> ZelTuningController::CreateTuningPoint(
    const UseCase& use_case, const TuningInfo& tuning_info,
    const TuningCoordinates& coordinates) const {
  return std::make_shared<ZelTuningPoint>(use_case, tuning_info, coordinates, use_bringup_tuning_);
}

StatusOr<std::shared_ptr<vosbrine::TuningUsecase>> ZelTuningController::GenerateTuningUseCase(
    const ZelTuningPoint& point, std::string_view device_name) const {
  auto usecase = std::make_shared<vosbrine::TuningUsecase>();
  MapTuningUseCase(point, device_name, usecase.get());
  return usecase;
}

bool ZelTuningController::MapTuningUseCase(const ZelTuningPoint& point,
                                           std::string_view device_name,
                                           vosbrine::TuningUsecase* usecase) const {
  *usecase = DefaultTuningUsecase();
  if (point.use_bringup_tuning) return true;
  // One part that can't be mapped discards the others: the default is taken whole.
  const vosbrine::CameraSensor sensor = ConvertToCameraSensor(
      device_name, point.tuning_info.sensor_mode_info.sensor_name, point.tuning_info.module_spec);
  if (sensor == vosbrine::INVALID_CAMERA_SENSOR) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "INVALID_CAMERA_SENSOR. Using default";
    return false;
  }
  const vosbrine::SensorMode mode = ConvertToSensorMode(
      point.tuning_info.sensor_mode_info, point.tuning_info.image_size, point.use_case);
  if (mode == vosbrine::INVALID_SENSOR_MODE) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "INVALID_SENSOR_MODE. Using default";
    return false;
  }
  const vosbrine::CameraUsecase camera_usecase = ConvertToCameraUseCase(point.use_case);
  if (camera_usecase == vosbrine::INVALID_CAMERA_USECASE) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds)
        << "INVALID_CAMERA_USECASE. Using default";
    return false;
  }
  usecase->set_camera_sensor(sensor);
  usecase->set_sensor_mode(mode);
  usecase->set_camera_usecase(camera_usecase);
  return true;
}

ZelTuningController::FrameTuning ZelTuningController::GetFrameTuning(
    const ZelTuningPoint& point) const {
  {
    std::lock_guard<std::mutex> lock(block_cache_->frame_mutex);
    if (block_cache_->frame_point != nullptr &&
        MappingInputsEqual(point, *block_cache_->frame_point)) {
      return block_cache_->frame_tuning;
    }
  }
  FrameTuning frame;
  // A point that falls back to the default use case is mapped afresh each time, so that its
  // (rate-limited) warnings are logged as they always were.
  if (!MapTuningUseCase(point, device_name_, &frame.usecase)) return frame;
  // Production always takes the nearest use case, which never fails on a loaded forest.
  frame.tree_set = provider_->FindPreparedTreeSet(frame.usecase, /*fallback=*/true);
  std::lock_guard<std::mutex> lock(block_cache_->frame_mutex);
  if (block_cache_->frame_point == nullptr) {
    block_cache_->frame_point = std::make_unique<ZelTuningPoint>(point);
  } else {
    *block_cache_->frame_point = point;
  }
  block_cache_->frame_tuning = frame;
  return frame;
}

StatusOr<bool> ZelTuningController::IsBlockEnabled(const TuningPoint& point,
                                                   std::string_view block_name) const {
  if (provider_ == nullptr) return FailedPreconditionError("Invalid provider");
  if (!block_name_index_.contains(block_name)) {
    return FailedPreconditionError(StrCat("Invalid block name ", block_name));
  }
  const auto* zel_point = dynamic_cast<const ZelTuningPoint*>(&point);
  if (zel_point == nullptr) return InvalidArgumentError("Invalid tuning point");
  StatusOr<std::shared_ptr<vosbrine::TuningUsecase>> usecase =
      GenerateTuningUseCase(*zel_point, device_name_);
  if (!usecase.ok()) return usecase.status();
  const std::string name(block_name);
  if (provider_->HasTuningUsecase(**usecase)) {
    if (IsSubBlockBypassed(zel_point->tuning_info.bypass_bitmask, block_name)) return false;
    return provider_->IsSubBlockEnabled(**usecase, name, /*fallback=*/false);
  }
  // Deliberately the default use case, where production takes the nearest key.
  TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds)
      << "Cannot find tuning use case: " << UsecaseText(**usecase)
      << ". Using default tuning for IsSubBlockEnabled().";
  return provider_->IsSubBlockEnabled(DefaultTuningUsecase(), name, /*fallback=*/false);
}

StatusOr<bool> ZelTuningController::IsTuningPointUpdated(const TuningPoint& a,
                                                         const TuningPoint& b) const {
  const ZelTuningPoint* point_a = AsZelTuningPoint(a);
  const ZelTuningPoint* point_b = AsZelTuningPoint(b);
  if (point_a == nullptr || point_b == nullptr) {
    return InvalidArgumentError("Invalid tuning point");
  }
  return CoordinatesDiffer(point_a->tuning_coordinates, point_b->tuning_coordinates) ||
         UseCaseFieldsDiffer(*point_a, *point_b);
}

StatusOr<int> ZelTuningController::GetUseCaseValue(const TuningPoint& point) const {
  const auto* zel_point = dynamic_cast<const ZelTuningPoint*>(&point);
  if (zel_point == nullptr) return InvalidArgumentError("Invalid tuning point");
  const vosbrine::SensorMode mode =
      ConvertToSensorMode(zel_point->tuning_info.sensor_mode_info,
                          zel_point->tuning_info.image_size, zel_point->use_case);
  if (mode == vosbrine::INVALID_SENSOR_MODE) {
    return InvalidArgumentError("Cannot get a valid use case");
  }
  return static_cast<int>(mode);
}

StatusOr<std::shared_ptr<TuningBundle>> ZelTuningController::Interpolate(
    std::shared_ptr<const TuningPoint> point,
    const FlatHashSet<std::string_view>& block_names) const {
  if (provider_ == nullptr) return FailedPreconditionError("Invalid provider");
  if (point == nullptr) return FailedPreconditionError("Invalid tuning point");
  const std::shared_ptr<const ZelTuningPoint> zel_point =
      std::dynamic_pointer_cast<const ZelTuningPoint>(point);
  if (zel_point == nullptr) return FailedPreconditionError("Invalid tuning point");
  return FillSubBlocksTuning(*zel_point, block_names);
}

StatusOr<std::shared_ptr<TuningBundle>> ZelTuningController::FillSubBlocksTuning(
    const ZelTuningPoint& point, const FlatHashSet<std::string_view>& block_names) const {
  FrameTuning frame = GetFrameTuning(point);
  const vosbrine::TuningUsecase& usecase = frame.usecase;
  // Made at the first block that is evaluated: a frame served from the cache needs no state.
  std::optional<vosbrine::CameraState> state;

  std::array<bool, kZelBlockCount> requested{};
  for (std::string_view name : block_names) {
    const auto position = block_name_index_.find(name);
    if (position == block_name_index_.end()) {
      return InvalidArgumentError(StrCat("Unrecognized block name: ", name));
    }
    requested[position->second] = true;
  }

  std::shared_ptr<ZelTuningBundle> bundle = block_cache_->bundles.Acquire();
  bundle->Reserve(block_names.size());
  Status first_failure;
  auto keep_first = [&first_failure](const Status& status) {
    if (!status.ok() && first_failure.ok()) first_failure = status;
  };
  ForEachZelBlockType([&]<size_t Position, typename T>() {
    if (!requested[Position]) return;
    constexpr std::string_view kName = kZelBlockNames[Position];
    std::lock_guard<std::mutex> lock(block_cache_mutex_);
    SharedBlock<T>& cached_block = std::get<Position>(block_cache_->blocks);
    std::unique_ptr<ZelTuningPoint>& cached_point = block_cache_->points[Position];
    SharedBlock<T> block;
    if (cached_point != nullptr) {
      const StatusOr<bool> updated = IsTuningPointUpdated(point, *cached_point);
      if (updated.ok() && !*updated) block = cached_block;
    }
    if (block == nullptr) {
      if (!state.has_value()) state = ConvertToCameraState(point);
      if (frame.tree_set == nullptr) {
        frame.tree_set = provider_->FindPreparedTreeSet(usecase, /*fallback=*/true);
      }
      // A block that no bundle holds any more, refilled over its storage; or a new one.
      std::shared_ptr<ZelTuningBlock<T>> fresh =
          std::get<Position>(block_cache_->block_pools).Acquire();
      // Production always takes the nearest use case. A failure is kept and the work goes on
      // with what the message holds; the block is cached all the same.
      const bool bypassed = IsSubBlockBypassed(point.tuning_info.bypass_bitmask, kName);
      if (frame.tree_set != nullptr) {
        keep_first(provider_->FillSubBlockTuning(*frame.tree_set, *block_cache_->fields[Position],
                                                 usecase, *state, &fresh->message, bypassed));
      } else {
        fresh->message.Clear();
        keep_first(provider_->FillSubBlockTuning(usecase, *state, &fresh->message,
                                                 /*fallback=*/true, bypassed));
      }
      if (cached_point == nullptr || UseCaseFieldsDiffer(point, *cached_point)) {
        TAVIK_LOG(VERBOSE) << "Tuning usecase is updated: " << UsecaseText(usecase);
      }
      cached_block = fresh;
      block = std::move(fresh);
      if (cached_point == nullptr) {
        cached_point = std::make_unique<ZelTuningPoint>(point);
      } else {
        *cached_point = point;
      }
    }
    bundle->AddNamedBlock(kName, std::move(block));
  });
  if (!first_failure.ok()) return first_failure;
  return std::shared_ptr<TuningBundle>(std::move(bundle));
}

Status ZelTuningController::SignalProducedTuningPoint(std::shared_ptr<TuningPoint> point) {
  if (tuning_point_queue_ != nullptr) tuning_point_queue_->push(point);
  return OkStatus();
}

void ZelTuningController::NotifyCaptureSessionOpen() {
  std::lock_guard<std::mutex> lock(session_mutex_);
  if (session_count_++ == 0) {
    tuning_point_queue_ = std::make_unique<WaitQueue<std::shared_ptr<TuningPoint>>>();
    signal_thread_ =
        std::make_unique<std::thread>(&ZelTuningController::SignalThreadFunction, this);
  }
}

void ZelTuningController::NotifyCaptureSessionClose() {
  std::lock_guard<std::mutex> lock(session_mutex_);
  // More closes than opens wrap the count around; nothing stops until it comes back to 1.
  if (session_count_-- == 1) {
    tuning_point_queue_->Shutdown();
    signal_thread_->join();
    signal_thread_.reset();
    tuning_point_queue_.reset();
  }
}

void ZelTuningController::SignalThreadFunction() {
  TAVIK_CHECK(tuning_point_queue_ != nullptr)
      << "tunint_point_queue_ must be created before starting the signalling thread!";
  const sched_param parameters{.sched_priority = 0};
  if (const int result = pthread_setschedparam(pthread_self(), SCHED_OTHER, &parameters);
      result != 0) {
    TAVIK_LOG(WARNING) << "Couldn't set scheduler parameters priority = 0 : " << strerror(result)
                       << "(" << result << ")";
  }
  // The return value, -1, is printed rather than errno, as the line has always read.
  if (const int result = setpriority(PRIO_PROCESS, gettid(), kSignalThreadNice); result != 0) {
    TAVIK_LOG(WARNING) << "Couldn't nice -10 the thread: " << strerror(result) << "(" << result
                       << ")";
  }
  std::shared_ptr<TuningPoint> point;
  while (tuning_point_queue_->Wait(&point)) {
    if (SoftwareFence* fence = point->GetFence(); fence != nullptr) fence->Signal(OkStatus());
  }
  point.reset();
}

}  // namespace tavik
