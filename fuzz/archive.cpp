#include "Require.h"

#include <LumoraKit/recording/LMRRecorderClasses.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <cstdint>

/// \file
/// Takes any bytes for the archive of a recorder. One that is made from it is archived as it was.

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
  static const lumora::fakes::FakePlatform platform;
  platform.log->clear();
  LMRErrorRef error;
  const std::string_view archive(reinterpret_cast<const char*>(bytes), size);
  const auto recorder = lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses(), &error);
  require(!recorder || !error);
  if (recorder) {
    const auto written = lumora::KeyedArchiver::archivedData(*recorder);
    const auto again = lumora::KeyedUnarchiver::unarchivedObject(written, LMRRecorderClasses(), &error);
    require(again && again->className() == recorder->className());
    require(lumora::KeyedArchiver::archivedData(*again) == written);
  }
  return 0;
}
