#pragma once

#include "recorder/model/DeviceList.h"
#include "recorder/model/Recovery.h"
#include "recorder/model/RoomForecast.h"
#include "recorder/model/Selection.h"
#include "recorder/model/ServerCatalogue.h"
#include "recorder/model/Settings.h"
#include "recorder/model/Submissions.h"
#include "recorder/model/Take.h"

#include <LumoraKit/LumoraKit.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace recorder {

/// The whole of the recorder without its window: the session, what can be recorded for which workflow, the sources that
/// are open, the take and what is submitted. Main thread only.
class Studio : public std::enable_shared_from_this<Studio> {
public:
  using PictureSize = std::optional<std::pair<std::uint32_t, std::uint32_t>>;

  static std::shared_ptr<Studio> make();
  Studio();
  Studio(const Studio&) = delete;
  Studio& operator=(const Studio&) = delete;
  ~Studio();

  /// Told when anything but pictures, levels and times has become another one.
  lumora::Notifier changed;

  /// Opens the queue of submissions and begins to look for devices.
  void begin();
  /// To be called some times a second: sources are looked at, and every other second devices, disk and transfers.
  void tick(const PictureSize& pictureSize);

  /// Who is logged in; null before.
  const std::shared_ptr<LMRSession>& session() const { return session_; }
  void setSession(std::shared_ptr<LMRSession> session);
  /// Asks the server anew.
  void reloadCatalogue();

  const Settings& settings() const { return settings_; }
  void setSettings(const Settings& settings);

  const ServerCatalogue& catalogue() const { return *catalogue_; }
  const DeviceList& devices() const { return *devices_; }
  const Selection& selection() const { return selection_; }
  /// Without effect while a take is under way.
  void selectWorkflow(const std::string& uuid);
  void chooseSource(std::size_t place, const SourceDescription& source);
  void chooseMicrophone(std::size_t place, const std::string& identifier);
  /// Opens the source of a place once more.
  void reopen(std::size_t place);

  /// One a place of the workflow.
  const std::vector<std::shared_ptr<Source>>& sources() const { return sources_; }

  const Episode& episode() const { return episode_; }
  void setEpisode(Episode episode) { episode_ = std::move(episode); }

  /// The one that can be started or is under way; null when nothing can be recorded.
  const std::shared_ptr<Take>& take() const { return take_; }
  bool canRecord() const { return take_ && take_->state() == TakeState::Ready; }
  bool isUnderWay() const { return take_ && take_->isUnderWay(); }
  void record();
  /// Seconds; nothing when it is not known.
  std::optional<double> roomLeft() const { return room_->seconds(); }

  Submissions& submissions() { return *submissions_; }

  /// What an earlier run has left behind; see Recovery::found().
  const Recovery& recovery() const { return *recovery_; }
  void submitUnfinished() { recovery_->submit(session_, submissions_); }
  void keepUnfinished() { recovery_->keep(); }
  void discardUnfinished() { recovery_->discard(); }
  void leaveUnfinished() { recovery_->later(); }

  /// What the user ought to know, in one sentence; empty when there is nothing.
  const std::string& notice() const { return notice_; }
  void dismissNotice();

private:
  void recoveryChanged();
  void devicesChanged();
  void restage();
  void openSource(std::size_t place);
  bool mustReopen(std::size_t place) const;
  void discardTake();
  void prepareTake();
  void takeChanged();
  void takeEnded();
  void submit();
  void lookSlowly();
  void tell(const std::string& notice);

  std::shared_ptr<LMRSession> session_;
  Settings settings_;
  Selection selection_;
  Episode episode_;
  std::string notice_;
  std::shared_ptr<DeviceList> devices_ = std::make_shared<DeviceList>();
  std::shared_ptr<ServerCatalogue> catalogue_ = std::make_shared<ServerCatalogue>();
  std::shared_ptr<Submissions> submissions_ = std::make_shared<Submissions>();
  std::shared_ptr<Recovery> recovery_ = std::make_shared<Recovery>();
  std::shared_ptr<RoomForecast> room_ = std::make_shared<RoomForecast>();
  std::vector<std::shared_ptr<Source>> sources_;
  std::vector<lumora::Connection> sourceConnections_;
  std::shared_ptr<Take> take_;
  lumora::Connection takeConnection_;
  std::vector<lumora::Connection> connections_;
  lumora::HostTime lookAgainAt_ = 0;
};

} // namespace recorder
