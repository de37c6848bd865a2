#pragma once

#include "recorder/model/Source.h"

#include <LumoraKit/LumoraKit.h>

#include <memory>

namespace recorder {

/// A camera of the server. Its picture is asked for every few seconds.
class RemoteSource final : public Source {
public:
  RemoteSource(PlannedSource plan, std::shared_ptr<LMRSession> session);

  void open() override;
  std::shared_ptr<LMRSourceRecorder> recorder() const override { return recorder_; }
  void renewRecorder() override;
  void look(std::optional<std::pair<std::uint32_t, std::uint32_t>> size) override;
  const lumora::Data& pictureFile() const override { return pictureFile_; }

private:
  void askForPicture();
  void pictureCame(const std::shared_ptr<LMRAction>& action);
  void pictureFailed();
  std::shared_ptr<RemoteSource> self() { return std::static_pointer_cast<RemoteSource>(shared_from_this()); }

  const std::shared_ptr<LMRSession> session_;
  std::shared_ptr<LMRRemoteVideoRecorder> recorder_;
  lumora::Data pictureFile_;
  bool isAsking_ = false;
  lumora::HostTime askAgainAt_ = 0;
};

} // namespace recorder
