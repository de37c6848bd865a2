// Tries the devices of this machine: lists them, or records any mix of them without a server, and prints what was
// measured.

#include "Devices.h"
#include "Measurement.h"
#include "Recording.h"

#include <iostream>

namespace {

int run(const tester::Options& options) {
  if (options.list) {
    tester::listDevices();
    return 0;
  }
  const auto sources = tester::openSources(options);
  std::cout << "Recording " << sources.size() << (sources.size() == 1 ? " source" : " sources") << " for "
            << options.seconds << " s; Ctrl-C ends it and keeps the files.\n"
            << std::flush;
  tester::record(sources, options);
  tester::printMeasurements(sources);
  return 0;
}

} // namespace

int main(int argc, char** argv) {
  // By this name the framework knows that a stop needs no server.
  lumora::Application::setIdentity("org.vantor.lumora.recordertester", "recordertester");
  int status = 0;
  const auto options = tester::parse(argc, argv, status);
  if (!options) {
    return status;
  }
  tester::catchInterrupts();
  try {
    return run(*options);
  } catch (const tester::Failure& failure) {
    std::cerr << "recordertester: " << failure.sentence << "\n";
    return failure.status;
  }
}
