#include "Options.h"

#include <algorithm>

#include <CLI/CLI.hpp>

namespace tester {
namespace {

constexpr int wrongUse = 2;

constexpr const char* examples = R"(DEVICE is a number or an identifier of --list, a name, or "default".

  recordertester --list
  recordertester --camera 1+1 --camera 2 --screen --seconds 20 --pause-at 5 --pause-at 10
  recordertester --microphone default --output /tmp)";

void describe(CLI::App& program, Options& options) {
  program.add_flag("--list", options.list, "List the devices and do nothing else");
  program
      .add_option("--camera", options.cameras,
                  "Record a camera, DEVICE; with the sound of a microphone, DEVICE+DEVICE; once a camera")
      ->allow_extra_args(false);
  program.add_option("--microphone", options.microphones, "Record a microphone; once a microphone")
      ->allow_extra_args(false);
  program.add_flag("--screen", options.screen, "Record the main screen");
  program.add_option("--screen-microphone", options.screenMicrophone, "Give the screen the sound of a microphone")
      ->needs("--screen");
  program.add_option("--seconds", options.seconds, "How long, without the pauses")
      ->capture_default_str()
      ->check(CLI::Range(0.5, 86400.0));
  program.add_option("--pause-at", options.pauses, "Pause after so many recorded seconds; once a pause")
      ->allow_extra_args(false)
      ->check(CLI::PositiveNumber);
  program.add_option("--pause-for", options.pauseLength, "Length of a pause in seconds")
      ->capture_default_str()
      ->check(CLI::Range(0.1, 3600.0));
  program.add_option("--output", options.folder, "Folder for the movie files")
      ->capture_default_str()
      ->check(CLI::ExistingDirectory);
}

void check(Options& options) {
  std::sort(options.pauses.begin(), options.pauses.end());
  if (!options.pauses.empty() && options.pauses.back() >= options.seconds) {
    throw CLI::ValidationError("--pause-at", "a pause must lie before the end of the recording (--seconds)");
  }
  if (!options.list && options.cameras.empty() && options.microphones.empty() && !options.screen) {
    throw CLI::RequiredError("--list, --camera, --microphone or --screen");
  }
}

} // namespace

std::optional<Options> parse(int argc, const char* const* argv, int& status) {
  CLI::App program("Tries the devices: lists them, or records any mix of them and prints what was measured.",
                   "recordertester");
  Options options;
  describe(program, options);
  program.footer(examples);
  try {
    program.parse(argc, argv);
    check(options);
    return options;
  } catch (const CLI::ParseError& end) {
    status = program.exit(end) == 0 ? 0 : wrongUse;
    return std::nullopt;
  }
}

} // namespace tester
