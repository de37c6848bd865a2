#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>

/// Domain of the errors of files that are no usable movies; the code is 1.
inline constexpr std::string_view LMRMovieFileErrorDomain = "org.vantor.lumora.moviefile";

/// What is left of a recorded movie file whose writer may have been killed.
///
///     auto movie = LMRMovieFile::movieFileWithPath(file);
///     if (movie.state == LMRMovieFile::State::Torn) {
///       LMRErrorRef error = movie.repair();      // movie.lostBytes() of a fragment that was not finished
///     }
///
/// The recorders write fragmented movies (ISO/IEC 14496-12): an index first, then each 0.8 seconds a fragment with an
/// index of its own. A file that ends in the midst of a fragment is whole up to that fragment. A value; it says what
/// the file was when it was looked at.
struct LUMORA_EXPORT LMRMovieFile {
  /// What a file is, when it is looked at.
  enum class State {
    /// Whole to its end, and playable.
    Complete,
    /// Whole up to a place; what comes after it cannot be used. Most programs play it, some refuse it.
    Torn,
    /// Not a movie, or one without a single whole fragment, or damaged long before its end, or not to be read: the
    /// reason is in `reason`.
    Unusable,
    /// There is no such file.
    Missing,
  };

  /// No recorder that is killed tears more than this, in bytes. A file with more after its whole part is damaged in
  /// another way, and nothing that may yet be saved is cut off.
  static constexpr std::uint64_t mostLostBytes = 64'000'000;

  /// The path that was given.
  std::filesystem::path file;
  /// What it was when it was looked at, or has become by repair().
  State state = State::Missing;
  /// In bytes.
  std::uint64_t size = 0;
  /// The length up to which the file is whole, in bytes; 0 for one that is unusable.
  std::uint64_t usableSize = 0;
  /// Of the part that is whole, in seconds.
  double duration = 0;
  /// Why it is unusable, for the user; else empty.
  std::string reason;

  /// Looks at the file; it is not changed. Reads the indexes only, whatever its length. Blocks for the disk. Any
  /// thread.
  static LMRMovieFile movieFileWithPath(const std::filesystem::path& file);

  /// Whether it needs no repair.
  bool isPlayable() const { return state == State::Complete; }
  /// What a repair takes away, or took.
  std::uint64_t lostBytes() const { return usableSize == 0 ? 0 : size - usableSize; }
  /// The same in seconds, at the rate of the part that is whole: an estimate.
  double lostSeconds() const;

  /// Cuts a torn file to what is whole, in one step: after a crash in the midst of it the file is as before or
  /// repaired. Null on success, with the state Complete, and for a file that is complete already; an error, with the
  /// file untouched, when it is unusable, missing, or has changed since it was looked at. Nobody may be writing it.
  /// Blocks for the disk. One thread at a time.
  LMRErrorRef repair();
};
