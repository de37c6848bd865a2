#include "support/Descriptors.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace lumora::tests {
namespace {

std::size_t entries(const char* folder) {
  using Iterator = std::filesystem::directory_iterator;
  return static_cast<std::size_t>(std::distance(Iterator(folder), Iterator()));
}

// A line of the process's status: "VmRSS:      1234 kB".
std::size_t statusBytes(const std::string& key) {
  constexpr std::size_t bytesInKilobyte = 1024;
  std::ifstream status("/proc/self/status");
  for (std::string word; status >> word;) {
    std::size_t kilobytes = 0;
    if (word == key && status >> kilobytes) {
      return kilobytes * bytesInKilobyte;
    }
  }
  return 0;
}

} // namespace

std::size_t openDescriptors() {
  return entries("/proc/self/fd") - 1;
}

std::size_t threadCount() {
  return entries("/proc/self/task");
}

std::size_t residentMemory() {
  return statusBytes("VmRSS:");
}

std::size_t peakResidentMemory() {
  return statusBytes("VmHWM:");
}

bool memoryCanBeMeasured() {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
  return false;
#else
  return true;
#endif
}

} // namespace lumora::tests
