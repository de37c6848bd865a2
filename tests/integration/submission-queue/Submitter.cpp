#include "Submitter.h"

#include "SandboxSession.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/RootedToolRunner.h>
#include <LumoraKit/workflows/LMRSubmissionQueue.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>

#include <sys/prctl.h>

int submitUntilKilled(const std::filesystem::path& serverRoot, const std::filesystem::path& queueFolder) {
  ::prctl(PR_SET_PDEATHSIG, SIGKILL);
  auto platform = lumora::Platform::current();
  platform.toolRunner = std::make_shared<lumora::RootedToolRunner>(serverRoot, platform.toolRunner);
  lumora::Platform::install(platform);
  LMRErrorRef error;
  const auto queue = LMRSubmissionQueue::queueWithFolder_error(queueFolder, &error);
  if (!queue) {
    std::fprintf(stderr, "There is no queue: %s\n", lumora::text(error).c_str());
    return EXIT_FAILURE;
  }
  std::puts("open");
  std::fflush(stdout);
  queue->setSession(sandboxSession());
  lumora::Platform::current().mainThread->serveUntil([] { return false; }, std::chrono::hours(1));
  return EXIT_FAILURE;
}
