#pragma once

#include <cstdint>
#include <string>

namespace lumora::sandbox {

/// A QuickTime movie of a length: the test picture at ten frames a second (PNG) and a tone (16-bit PCM, 8 kHz, mono),
/// or the tone alone. Ten frames and one second of sound are stored once and played again and again, so that an hour's
/// recording takes no time and a few hundred kilobytes.
/// \param milliseconds  cut to between one frame and one day
std::string makeMovie(std::int64_t milliseconds, bool hasPicture);

} // namespace lumora::sandbox
