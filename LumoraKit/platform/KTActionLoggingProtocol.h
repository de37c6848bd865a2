#pragma once

#include <LumoraKit/platform/KTHost.h>

#include <string>

/// What an action shows of itself to whoever keeps a record of server traffic. Any thread.
class LUMORA_EXPORT KTActionLoggingProtocol {
public:
  virtual ~KTActionLoggingProtocol();

  /// The host that the action talks to.
  virtual KTHost server() const = 0;
  /// What is run.
  virtual std::string title() const = 0;
  /// What is asked.
  virtual std::string requestDescription() const = 0;
  /// What came back.
  virtual std::string responseDescription() const = 0;
};
