#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

/// \file
/// This bench run again as a process of its own, for what would disturb the others.

namespace lumora::bench {

/// One block more than 256 MiB: past a power of two, where a string that grows by doubling needs most.
inline constexpr std::size_t outputBlock = std::size_t{64} << 10U;
inline constexpr std::size_t largeOutput = (std::size_t{256} << 20U) + outputBlock;
inline constexpr std::size_t largeError = std::size_t{64} << 20U;

/// The exit status of the role that the arguments name; nothing when this is the bench itself.
std::optional<int> runRole(int argc, char** argv);

std::string ownExecutable();

/// Arguments for a tool that writes largeOutput and largeError at once.
std::vector<std::string> emitter();

/// Arguments for a process that collects the emitter's outputs with KTRunTask and prints how much its resident memory
/// grew at most, in bytes.
std::vector<std::string> collector();

/// One action of a trivial tool, made, run and ended.
void runTrivialAction();
/// The request that such an action sends.
const std::string& trivialRequest();
inline constexpr const char* trivialTool = "/bin/true";

/// A process of its own that runs the trivial action when asked to, small or with 2 GiB of touched memory and 200 open
/// descriptors.
class Parent {
public:
  enum class Size { Small, Large };

  explicit Parent(Size size);
  Parent(const Parent&) = delete;
  Parent& operator=(const Parent&) = delete;
  ~Parent();

  /// The seconds that one action took in there.
  double secondsOfAction();

private:
  int requests_ = -1;
  int answers_ = -1;
  int process_ = -1;
};

} // namespace lumora::bench
