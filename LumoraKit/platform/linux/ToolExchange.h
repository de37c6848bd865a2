#pragma once

#include <LumoraKit/platform/linux/ChildProcess.h>
#include <LumoraKit/platform/linux/FileDescriptor.h>
#include <LumoraKit/platform/linux/SigPipeGuard.h>

#include <chrono>
#include <cstddef>
#include <string>
#include <string_view>

namespace lumora::backend {

/// This side of a child's standard input: writes a text bit by bit as the child reads it, then closes.
class ToolInput {
public:
  /// The text is not copied (it may hold a password) and must outlive this object.
  ToolInput(FileDescriptor descriptor, std::string_view text);

  int descriptor() const { return descriptor_.get(); }
  void writeSome(SigPipeGuard& guard);
  void close() { descriptor_.close(); }
  /// Why a part of the text was lost on its way (an errno); 0 when the child got it all, or wanted no more.
  int failure() const { return failure_; }

private:
  FileDescriptor descriptor_;
  std::string_view rest_;
  int failure_ = 0;
};

/// This side of one of a child's outputs: collects everything until the last writer has closed it.
class ToolOutput {
public:
  ToolOutput(FileDescriptor descriptor, std::string& text) : descriptor_(std::move(descriptor)), text_(text) {}

  int descriptor() const { return descriptor_.get(); }
  bool isOpen() const { return descriptor_.isOpen(); }
  /// Reads once; to be called when there is something to read, or the end.
  void readSome();
  /// Reads what is in the pipe at this moment.
  void readWhatIsThere();
  /// Why the rest was lost (an errno); 0 when nothing was.
  int failure() const { return failure_; }

private:
  FileDescriptor descriptor_;
  std::string& text_;
  int failure_ = 0;
};

/// Feeds a running child and collects its outputs, all at once, until the child has ended and its outputs are closed.
/// A process that outlives the child may hold the outputs open: they are then left after a short grace. What the child
/// itself wrote is complete in any case.
class ToolExchange {
public:
  ToolExchange(ChildProcess& child, ToolInput input, ToolOutput standardOutput, ToolOutput standardError);
  /// Blocks. 0, or the errno that says why something was lost on its way.
  int run();

private:
  using Clock = std::chrono::steady_clock;

  bool isOver() const;
  int pollTimeout() const;
  void serveOnce();
  void childEnded();

  SigPipeGuard sigPipeGuard_;
  ChildProcess& child_;
  ToolInput input_;
  ToolOutput standardOutput_;
  ToolOutput standardError_;
  bool ended_ = false;
  Clock::time_point graceEnd_;
};

} // namespace lumora::backend
