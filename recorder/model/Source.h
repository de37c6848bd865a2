#pragma once

#include "recorder/model/SourceDescription.h"

#include <LumoraKit/LumoraKit.h>

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace recorder {

/// What the user wants recorded at one place of a workflow.
struct PlannedSource {
  SourceDescription source;
  /// Identifier of the microphone that is recorded with a camera or the screen; empty for none.
  std::string microphone;

  friend bool operator==(const PlannedSource&, const PlannedSource&) = default;
};

enum class SourceState { Opening, AskingUser, Ready, Starting, Recording, Paused, Failed };

/// One source that is open: it shows and hears what it would record. Main thread only.
class Source : public std::enable_shared_from_this<Source> {
public:
  explicit Source(PlannedSource plan);
  Source(const Source&) = delete;
  Source& operator=(const Source&) = delete;
  virtual ~Source();

  /// Told when the state has become another one by itself. A recording's progress is told by the take.
  lumora::Notifier changed;

  const PlannedSource& plan() const { return plan_; }
  SourceState state() const;
  /// Why it cannot be recorded (any more); null while it can.
  const LMRErrorRef& error() const { return error_; }
  /// It was lost.
  void fail(LMRErrorRef error);

  /// Begins to open it; the outcome is told by `changed`.
  virtual void open() = 0;
  /// For the next take; null as long as it is not open.
  virtual std::shared_ptr<LMRSourceRecorder> recorder() const = 0;
  /// Puts a new recorder in the place of one that has been used.
  virtual void renewRecorder() = 0;
  /// Some times a second: hears and sees what has come since, the picture within that size (in pixels; nothing when
  /// nobody sees it).
  virtual void look(std::optional<std::pair<std::uint32_t, std::uint32_t>> size) = 0;

  virtual bool hasSound() const;
  /// One entry a channel; none when nothing was heard lately.
  virtual const std::vector<lumora::SoundLevel>& levels() const;
  /// Whether its microphone has been silent for 10 seconds.
  virtual bool isSilent() const;
  /// The newest picture; nothing before the first.
  virtual const std::optional<lumora::Picture>& picture() const;
  /// The newest picture of a camera of the server, as a PNG or JPEG file; empty before the first.
  virtual const lumora::Data& pictureFile() const;

protected:
  void setError(LMRErrorRef error) { error_ = std::move(error); }
  virtual bool isAskingUser() const;

private:
  const PlannedSource plan_;
  LMRErrorRef error_;
};

/// A source for the plan, not open yet.
std::shared_ptr<Source> makeSource(const PlannedSource& plan, const std::shared_ptr<LMRSession>& session,
                                   const std::optional<lumora::CompressionOptions>& videoCompression);

} // namespace recorder
