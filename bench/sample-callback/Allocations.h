#pragma once

#include <cstddef>

/// How often this thread has allocated with operator new.
std::size_t allocationsOfThisThread();
