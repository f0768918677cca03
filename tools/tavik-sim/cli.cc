#include "tools/tavik-sim/cli.h"

#include <unistd.h>

#include <cstdio>
#include <memory>
#include <optional>

#include "absl/strings/numbers.h"
#include "android-base/logging.h"
#include "tavik/base/strings.h"
#include "tavik/base/system_properties.h"
#include "tavik/iq/zel/zel_tuning_controller.h"
#include "tools/tavik-sim/chrome_trace.h"
#include "tools/tavik-sim/frame_log.h"
#include "tools/tavik-sim/scenario.h"
#include "tools/tavik-sim/session_runner.h"
#include "tools/tavik-sim/summary.h"

namespace tavik::sim {
namespace {

constexpr char kUsage[] =
    R"(Usage: tavik-sim [options]

Runs a simulated camera session through the tuning controller: per frame a tuning point, the
blocks' switches, all blocks interpolated, every translator, and the point's fence; then prints a
summary.

Options:
  --tuning DIR        tuning files to load (default: the sample tuning set)
  --scenario FILE     scenario in protobuf text (default: the built-in scenario)
  --frames N          run only the first N frames
  --frames-out FILE   write one JSON line per frame
  --trace FILE        write the spans of the run as a Chrome trace-event file
  --prop KEY=VALUE    set a system property before the session starts (repeatable)
  --log               show the library's log lines (warnings such as missing tuning keys)
  --quiet             no progress bar and no summary
  --help              this text

Exit status: 0 on success, 1 when a frame failed, 2 on bad arguments or a bad scenario file.
)";

struct Options {
  std::string tuning = TAVIK_SAMPLE_TUNING_DIR;
  std::string scenario;
  int frames = -1;
  std::string frames_out;
  std::string trace;
  std::vector<std::pair<std::string, std::string>> properties;
  bool quiet = false;
  bool log = false;
  bool help = false;
};

// Options, or the usage error's text.
std::optional<std::string> ParseArgs(const std::vector<std::string>& args, Options& options) {
  for (size_t i = 0; i < args.size(); ++i) {
    const std::string& arg = args[i];
    const auto value = [&]() -> const std::string* {
      return i + 1 < args.size() ? &args[++i] : nullptr;
    };
    if (arg == "--help" || arg == "-h") {
      options.help = true;
    } else if (arg == "--quiet") {
      options.quiet = true;
    } else if (arg == "--log") {
      options.log = true;
    } else if (arg == "--tuning" || arg == "--scenario" || arg == "--frames" ||
               arg == "--frames-out" || arg == "--trace" || arg == "--prop") {
      const std::string* v = value();
      if (v == nullptr) return StrCat(arg, " needs a value");
      if (arg == "--tuning") {
        options.tuning = *v;
      } else if (arg == "--scenario") {
        options.scenario = *v;
      } else if (arg == "--frames") {
        if (!absl::SimpleAtoi(*v, &options.frames) || options.frames < 0) {
          return StrCat("--frames: '", *v, "' is not a frame count");
        }
      } else if (arg == "--frames-out") {
        options.frames_out = *v;
      } else if (arg == "--trace") {
        options.trace = *v;
      } else {
        const size_t equals = v->find('=');
        if (equals == std::string::npos || equals == 0) {
          return StrCat("--prop: '", *v, "' is not KEY=VALUE");
        }
        options.properties.emplace_back(v->substr(0, equals), v->substr(equals + 1));
      }
    } else {
      return StrCat("unexpected argument '", arg, "'");
    }
  }
  return std::nullopt;
}

// A one-line bar, redrawn in place.
void DrawProgress(std::ostream& err, int done, int total) {
  constexpr int kWidth = 40;
  const int filled = total > 0 ? done * kWidth / total : kWidth;
  err << "\r[" << std::string(filled, '#') << std::string(kWidth - filled, ' ') << "] " << done
      << "/" << total << " frames" << (done == total ? "\n" : "") << std::flush;
}

}  // namespace

int RunSimCommand(const std::vector<std::string>& args, std::ostream& out, std::ostream& err) {
  Options options;
  if (std::optional<std::string> error = ParseArgs(args, options)) {
    err << "tavik-sim: " << *error << "\n"
        << "Try 'tavik-sim --help'.\n";
    return kExitUsage;
  }
  if (options.help) {
    out << kUsage;
    return kExitOk;
  }

  StatusOr<Scenario> scenario =
      options.scenario.empty() ? DefaultScenario() : ReadScenarioFile(options.scenario);
  if (!scenario.ok()) {
    err << "tavik-sim: " << scenario.status().message() << "\n";
    return kExitUsage;
  }
  const std::vector<SimFrame> frames = ExpandScenario(*scenario, options.frames);

  for (const auto& [key, value] : options.properties) {
    if (Status status = SystemProperties::GetInstance().Set(key, value); !status.ok()) {
      err << "tavik-sim: --prop " << key << ": " << status.message() << "\n";
      return kExitUsage;
    }
  }

  // The library warns on every frame whose key falls back; the summary says it once.
  const android::base::LogSeverity previous_severity = android::base::SetMinimumLogSeverity(
      options.log ? android::base::VERBOSE : android::base::FATAL_WITHOUT_ABORT);
  struct RestoreSeverity {
    android::base::LogSeverity severity;
    ~RestoreSeverity() { android::base::SetMinimumLogSeverity(severity); }
  } restore_severity{previous_severity};

  ChromeTraceSink trace_sink;
  std::optional<ScopedTraceSink> installed;
  if (!options.trace.empty()) installed.emplace(&trace_sink);

  std::vector<FrameRecord> records;
  {
    ZelTuningController controller(
        "", {options.tuning},
        FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>());
    if (controller.provider() == nullptr) {
      err << "tavik-sim: " << options.tuning << ": no tuning loaded\n";
      return kExitFailure;
    }
    RunOptions run_options;
    if (!options.quiet && isatty(STDERR_FILENO)) {
      run_options.on_frame = [&err](int done, int total) { DrawProgress(err, done, total); };
    }
    records = RunSession(controller, frames, run_options);
  }
  installed.reset();

  int status = RunFailed(records) ? kExitFailure : kExitOk;
  if (!options.frames_out.empty()) {
    if (Status written = WriteFrameLog(options.frames_out, records); !written.ok()) {
      err << "tavik-sim: " << written.message() << "\n";
      status = kExitFailure;
    }
  }
  if (!options.trace.empty()) {
    if (Status written = trace_sink.Write(options.trace); !written.ok()) {
      err << "tavik-sim: " << written.message() << "\n";
      status = kExitFailure;
    }
  }
  if (!options.quiet) out << FormatSummary(records);
  return status;
}

}  // namespace tavik::sim
