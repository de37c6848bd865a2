#pragma once

#include "recorder/model/SourceDescription.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <vector>

namespace recorder {

/// What this machine can record with: it is looked up again and again, because devices come and go. Main thread only.
class DeviceList : public std::enable_shared_from_this<DeviceList> {
public:
  /// Told when something has come or gone.
  lumora::Notifier changed;

  /// Looks on a worker, unless it is looking already.
  void refresh();
  /// Tries on a worker which encoders work.
  void findEncoders();
  /// False until the first look has ended.
  bool isKnown() const { return isKnown_; }
  /// The default one first.
  const SourceDescriptions& cameras() const { return found_.cameras; }
  const SourceDescriptions& microphones() const { return found_.microphones; }
  bool hasScreen() const { return found_.hasScreen; }
  /// For pictures, the framework's choice first; none before they were tried.
  const std::vector<lumora::MediaEncoder>& encoders() const { return encoders_; }

private:
  struct Found {
    SourceDescriptions cameras;
    SourceDescriptions microphones;
    bool hasScreen = false;

    friend bool operator==(const Found&, const Found&) = default;
  };

  static Found look();
  void take(Found found);

  bool isLooking_ = false;
  bool isKnown_ = false;
  Found found_;
  std::vector<lumora::MediaEncoder> encoders_;
};

} // namespace recorder
