#pragma once

namespace lumora::sandbox {

/// The program `lumora-sandbox`. Its exit status: 0 done, 1 failed with the reason on standard error, 2 wrong use.
int administrate(int argc, char** argv);

} // namespace lumora::sandbox
