// Mapping from the camera service's description of a frame to the keys of the tuning files: the
// sensor, the sensor mode and the use case, and the camera state at which trees are evaluated.
// Names are composed as text and parsed as enum names, so that a new combination needs only a new
// enum row.
#ifndef TAVIK_IQ_ZEL_ZEL_TUNING_CONTROLLER_UTIL_H_
#define TAVIK_IQ_ZEL_ZEL_TUNING_CONTROLLER_UTIL_H_

#include <string_view>
#include <vector>

#include "tavik/base/camera_types.h"
#include "tavik/base/status.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {

// "BRIMAL_" or, for the device "fennelmoore", "FENNELMOORE_", then the facing, the sensor's name
// and the kind of lens: "BRIMAL_REAR_GN1_NORMAL". INVALID_CAMERA_SENSOR when the module can't be
// named or no enum row has the name (the latter logged).
TAVIK_EXPORT vosbrine::CameraSensor ConvertToCameraSensor(
    std::string_view device_name, std::string_view sensor_name,
    const tavik_api::SensorModuleSpec& module_spec);

// Binning, aspect, resolution and frame rate of the frame: "FULL_16_9_1080P_30FPS".
// INVALID_SENSOR_MODE (logged) when a part can't be told or no enum row has the name.
TAVIK_EXPORT vosbrine::SensorMode ConvertToSensorMode(const TuningSensorModeInfo& info,
                                                      tavik_api::GenericSize<int> image_size,
                                                      const UseCase& use_case);

// The use case by type, torch, night and first party. INVALID_CAMERA_USECASE (logged) for an
// unknown type.
TAVIK_EXPORT vosbrine::CameraUsecase ConvertToCameraUseCase(const UseCase& use_case);

// All ten coordinates of the point; the frame counter becomes a float.
TAVIK_EXPORT vosbrine::CameraState ConvertToCameraState(const ZelTuningPoint& point);

TAVIK_EXPORT StatusOr<vosbrine::BayerPattern> ConvertToBayerPattern(
    ColorFilterArrangement arrangement);

// The frame-rate ranges that sensor modes are named by, in order of preference on a tie.
TAVIK_EXPORT const std::vector<tavik_api::Range<float>>& FrameRateCandidates();
// Output sizes that mark a video stream.
TAVIK_EXPORT const std::vector<tavik_api::GenericSize<int>>& VideoSizes();

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_ZEL_TUNING_CONTROLLER_UTIL_H_
