#pragma once

#include <gtest/gtest.h>

#include <functional>

#include <pthread.h>

namespace lumora::tests {

/// Runs the work on a thread with a stack of 128 KiB, which recursion to thousands of levels would overflow.
inline void onSmallStack(const std::function<void()>& work) {
  pthread_attr_t attributes;
  pthread_attr_init(&attributes);
  ASSERT_EQ(pthread_attr_setstacksize(&attributes, std::size_t{128} * 1024), 0);
  pthread_t thread{};
  const auto run = [](void* argument) -> void* {
    (*static_cast<const std::function<void()>*>(argument))();
    return nullptr;
  };
  std::function<void()> copy = work;
  ASSERT_EQ(pthread_create(&thread, &attributes, run, &copy), 0);
  pthread_join(thread, nullptr);
  pthread_attr_destroy(&attributes);
}

} // namespace lumora::tests
