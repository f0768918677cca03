// tavik-tune: the tuning engineer's tool for tuning files.
//
//   tavik-tune compile IN.textproto -o OUT.binarypb
//   tavik-tune print FILE.binarypb
//   tavik-tune lint FILE_OR_DIR...
//   tavik-tune eval DIR --sensor S --mode M --usecase U [--cct X ...] [--block NAME ...]
//   tavik-tune keys DIR...
//   tavik-tune plot sweep|shading|curves DIR --sensor S --mode M --usecase U ... -o OUT.png
//   tavik-tune diff OLD NEW
//
// Every verb answers --help. Exit status: 0 on success, 1 when the verb failed, 2 on a usage
// error.
#include <cstdlib>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

#include "android-base/logging.h"
#include "tools/common/text_proto.h"
#include "tools/tavik-tune/diff.h"
#include "tools/tavik-tune/eval.h"
#include "tools/tavik-tune/keys.h"
#include "tools/tavik-tune/lint.h"
#include "tools/tavik-tune/plot.h"
#include "tools/tavik-tune/proto_files.h"

namespace tavik::tune {
namespace {

constexpr int kExitOk = 0;
constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

struct Verb {
  const char* name;
  const char* usage;
  const char* help;
  int (*run)(const std::vector<std::string>& args);
};

bool WantsHelp(const std::vector<std::string>& args) {
  for (const std::string& arg : args) {
    if (arg == "--help" || arg == "-h") return true;
  }
  return false;
}

int Fail(const Status& status) {
  std::cerr << "tavik-tune: " << status.message() << "\n";
  return kExitFailure;
}

int RunCompile(const std::vector<std::string>& args) {
  std::string input;
  std::string output;
  for (size_t i = 0; i < args.size(); ++i) {
    if (args[i] == "-o" && i + 1 < args.size()) {
      output = args[++i];
    } else if (input.empty() && !args[i].empty() && args[i][0] != '-') {
      input = args[i];
    } else {
      std::cerr << "tavik-tune compile: unexpected argument '" << args[i] << "'\n";
      return kExitUsage;
    }
  }
  if (input.empty() || output.empty()) {
    std::cerr << "usage: tavik-tune compile IN.textproto -o OUT.binarypb\n";
    return kExitUsage;
  }
  auto message = NewMessageForPath(input);
  if (Status status = tools::ParseTextProtoFile(input, *message); !status.ok()) return Fail(status);
  std::string bytes;
  if (!message->SerializeToString(&bytes)) {
    return Fail(InternalError(input + ": cannot serialise"));
  }
  if (Status status = tools::WriteStringToFile(output, bytes); !status.ok()) return Fail(status);
  return kExitOk;
}

int RunPrint(const std::vector<std::string>& args) {
  if (args.size() != 1 || args[0].empty() || args[0][0] == '-') {
    std::cerr << "usage: tavik-tune print FILE.binarypb\n";
    return kExitUsage;
  }
  auto message = NewMessageForPath(args[0]);
  if (Status status = ParseBinaryFile(args[0], *message); !status.ok()) return Fail(status);
  std::cout << ToText(*message);
  return kExitOk;
}

int RunLint(const std::vector<std::string>& args) {
  if (args.empty()) {
    std::cerr << "usage: tavik-tune lint FILE_OR_DIR...\n";
    return kExitUsage;
  }
  const std::vector<LintFinding> findings = LintPaths(args);
  for (const LintFinding& finding : findings) std::cout << finding.ToString() << "\n";
  return findings.empty() ? kExitOk : kExitFailure;
}

int RunEvalVerb(const std::vector<std::string>& args) {
  StatusOr<EvalRequest> request = ParseEvalArgs(args);
  if (!request.ok()) {
    std::cerr << "tavik-tune eval: " << request.status().message() << "\n";
    return kExitUsage;
  }
  if (Status status = RunEval(*request, std::cout); !status.ok()) return Fail(status);
  return kExitOk;
}

int RunKeysVerb(const std::vector<std::string>& args) {
  if (args.empty()) {
    std::cerr << "usage: tavik-tune keys DIR...\n";
    return kExitUsage;
  }
  if (Status status = RunKeys(args, std::cout); !status.ok()) return Fail(status);
  return kExitOk;
}

int RunPlotVerb(const std::vector<std::string>& args) {
  StatusOr<PlotRequest> request = ParsePlotArgs(args);
  if (!request.ok()) {
    std::cerr << "tavik-tune plot: " << request.status().message() << "\n";
    return kExitUsage;
  }
  if (Status status = RunPlot(*request); !status.ok()) return Fail(status);
  return kExitOk;
}

// As diff(1): 1 means only that the tunings differ, so trouble reading them is 2.
int RunDiffVerb(const std::vector<std::string>& args) {
  StatusOr<DiffRequest> request = ParseDiffArgs(args);
  if (!request.ok()) {
    std::cerr << "tavik-tune diff: " << request.status().message() << "\n";
    return kExitUsage;
  }
  StatusOr<std::vector<DiffFinding>> findings = DiffTunings(*request);
  if (!findings.ok()) {
    std::cerr << "tavik-tune: " << findings.status().message() << "\n";
    return kExitUsage;
  }
  for (const DiffFinding& finding : *findings) std::cout << finding.ToString() << "\n";
  return findings->empty() ? kExitOk : kExitFailure;
}

const Verb kVerbs[] = {
    {"compile", "compile IN.textproto -o OUT.binarypb",
     "Compiles a tuning file from protobuf text to binary. A path containing\n"
     "\"golden_sensor_factory_calibration_data\" holds a GoldenSensorFactoryCalibrationData,\n"
     "any other a TuningUsecaseData. Any fields are written in expanded form:\n"
     "  [type.googleapis.com/vosbrine.zelmondrake.TuningTreeSet] { ... }\n",
     RunCompile},
    {"print", "print FILE.binarypb",
     "Prints a binary tuning file as protobuf text, with Any fields expanded.\n", RunPrint},
    {"lint", "lint FILE_OR_DIR...",
     "Finds what the runtime would get wrong or fail on: regions not ascending by upper,\n"
     "lower > upper, overlapping regions, UNKNOWN or out-of-range level types, empty levels,\n"
     "nodes with neither child nor leaf, leaves or static_param of the wrong type, type URLs\n"
     "without the full name, repeated float fields whose lengths differ between the leaves of\n"
     "a tree, missing trees, duplicate use-case keys across files, files that aren't .binarypb.\n"
     "One line per finding: FILE: BLOCK: PATH: PROBLEM. Exit status 1 when anything is found.\n",
     RunLint},
    {"eval", "eval DIR --sensor S --mode M --usecase U [--cct X ...] [--block NAME ...]", kEvalHelp,
     RunEvalVerb},
    {"keys", "keys DIR...",
     "Prints the forest's keys in sort order, each with the file that won it, and the files\n"
     "that a key dropped because another file with the same key was read first.\n",
     RunKeysVerb},
    {"plot", "plot sweep|shading|curves DIR --sensor S --mode M --usecase U ... -o OUT.png|.svg",
     kPlotHelp, RunPlotVerb},
    {"diff", "diff OLD NEW", kDiffHelp, RunDiffVerb},
};

void PrintUsage(std::ostream& out) {
  out << "usage: tavik-tune VERB [ARGS...]\n\nVerbs:\n";
  for (const Verb& verb : kVerbs) out << "  " << verb.usage << "\n";
  out << "\nRun 'tavik-tune VERB --help' for a verb's details.\n";
}

// The library's log lines go to stderr as "tavik-tune: <severity>: <message>"; below warnings
// only with TAVIK_TUNE_VERBOSE set.
void SetUpLogging() {
  android::base::SetMinimumLogSeverity(std::getenv("TAVIK_TUNE_VERBOSE") != nullptr
                                           ? android::base::VERBOSE
                                           : android::base::WARNING);
  android::base::SetLogger([](android::base::LogId, android::base::LogSeverity severity,
                              const char*, const char*, unsigned int, const char* message) {
    static constexpr const char* kNames[] = {"verbose", "debug", "info",
                                             "warning", "error", "fatal"};
    const int index = static_cast<int>(severity);
    std::cerr << "tavik-tune: " << (index >= 0 && index < 6 ? kNames[index] : "log") << ": "
              << message << "\n";
  });
}

int Main(int argc, char** argv) {
  SetUpLogging();
  if (argc < 2) {
    PrintUsage(std::cerr);
    return kExitUsage;
  }
  const std::string_view verb_name = argv[1];
  if (verb_name == "--help" || verb_name == "-h" || verb_name == "help") {
    PrintUsage(std::cout);
    return kExitOk;
  }
  const std::vector<std::string> args(argv + 2, argv + argc);
  for (const Verb& verb : kVerbs) {
    if (verb_name != verb.name) continue;
    if (WantsHelp(args)) {
      std::cout << "usage: tavik-tune " << verb.usage << "\n\n" << verb.help;
      return kExitOk;
    }
    return verb.run(args);
  }
  std::cerr << "tavik-tune: unknown verb '" << verb_name << "'\n";
  PrintUsage(std::cerr);
  return kExitUsage;
}

}  // namespace
}  // namespace tavik::tune

int main(int argc, char** argv) { return tavik::tune::Main(argc, argv); }
