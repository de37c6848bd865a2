#pragma once

#include <LumoraKit/platform/KeyedArchive.h>

/// The recorders that can be archived, by class name:
///
///     const auto archive = lumora::KeyedArchiver::archivedData(*recorder);
///     ...
///     auto object = lumora::KeyedUnarchiver::unarchivedObject(archive, LMRRecorderClasses(), &error);
///     auto recorder = std::dynamic_pointer_cast<LMRSourceRecorder>(object);
///
/// A decoded recorder is idle. Any thread.
LUMORA_EXPORT lumora::KeyedUnarchiver::ClassTable LMRRecorderClasses();
