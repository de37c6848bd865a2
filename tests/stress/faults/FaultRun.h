#pragma once

#include "FaultyCalls.h"

#include <cstddef>
#include <filesystem>
#include <functional>
#include <memory>
#include <set>
#include <string>
#include <vector>

namespace lumora::tests {

/// Something that is tried while a system call fails. Made, used and destroyed in a process of its own for every try;
/// all that fails is told with the call that failed. The constructor prepares, without faults.
class FaultScenario {
public:
  /// \param folder empty, of this try alone
  explicit FaultScenario(std::filesystem::path folder) : folder_(std::move(folder)) {}
  FaultScenario(const FaultScenario&) = delete;
  FaultScenario& operator=(const FaultScenario&) = delete;
  virtual ~FaultScenario();

  /// Does it, and lets go of all descriptors and children; afterwards the run looks for some that are left. Notes how
  /// it ended, and expects nothing yet.
  virtual void act() = 0;
  /// Looks, without faults, at the outcome and at what is left, by the expectations of a test.
  /// \param fault what has failed; its call is 0 when nothing was to fail
  virtual void check(const Fault& fault) = 0;

protected:
  const std::filesystem::path folder_;
};

/// What a run has shown.
struct FaultFindings {
  /// A text for each try that crashed, hung, left something open, or did not meet its expectations.
  std::vector<std::string> failures;
  /// The functions that were made to fail.
  std::set<std::string> functions;
  /// How many tries there were with a call that failed.
  std::size_t tries = 0;
};

using MakeFaultScenario = std::function<std::unique_ptr<FaultScenario>(const std::filesystem::path& folder)>;

/// Tries the scenario once without a fault; then, for each function that it has called, with the first call failing, in
/// each way in which it can; then with the second; until there are no more. Stops after a few failures.
/// \param deadlineSeconds for one try, which otherwise counts as hung
FaultFindings runWithFaults(const MakeFaultScenario& make, int deadlineSeconds = 60);

template <class Scenario> FaultFindings runWithFaults(int deadlineSeconds = 60) {
  return runWithFaults([](const std::filesystem::path& folder) { return std::make_unique<Scenario>(folder); },
                       deadlineSeconds);
}

/// Expects that the run of a scenario has found nothing, and has made these functions fail at least.
void expectHolds(const FaultFindings& findings, const std::vector<std::string>& functions);

/// The names of the files below a folder, with their folders; none when there is no such folder.
std::vector<std::string> filesBelow(const std::filesystem::path& folder);

} // namespace lumora::tests
