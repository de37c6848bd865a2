#include "Require.h"

#include <LumoraKit/recording/LMRMovieFile.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <cstdint>

/// \file
/// Takes any bytes for a movie file. What is whole of it is in it, and after a repair it is complete.

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  constexpr const char* file = "/movie.mov";
  static const lumora::fakes::FakePlatform platform;
  platform.log->clear();
  platform.files->writeAtomically(file, {reinterpret_cast<const char*>(bytes), size});
  LMRMovieFile movie = LMRMovieFile::movieFileWithPath(file);
  require(movie.size == size && movie.usableSize <= size);
  require((movie.state == LMRMovieFile::State::Unusable) == !movie.reason.empty());
  if (movie.state == LMRMovieFile::State::Torn) {
    require(movie.repair() == nullptr);
    const LMRMovieFile repaired = LMRMovieFile::movieFileWithPath(file);
    require(repaired.isPlayable() && repaired.size == movie.usableSize && repaired.duration == movie.duration);
  }
  return 0;
}
