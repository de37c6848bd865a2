#pragma once

#include <LumoraKit/platform/Value.h>

#include <cstdint>
#include <string_view>

/// What kind of recording a workflow takes.
enum LMRWorkflowType : std::int32_t {
  /// Nothing that this framework records.
  LMRWorkflowTypeUnsupported = 0,
  /// One recording: exactly one source, no folder, of "Video", "Audio", "Screen" or "File".
  LMRWorkflowTypeSingleSource = 1,
  /// Two recordings: exactly two sources, no folder among them, each of at least one of the four.
  LMRWorkflowTypeDualSource = 2,
  /// A folder of files: exactly one source, a folder, of "File".
  LMRWorkflowTypeFolder = 3,
};

/// Queries on a workflow description, one entry of LMRWorkflowsKey in the reply to "listworkflows". Under
/// LMRWorkflowSourcesKey it lists the sources that the workflow takes; each has "sourceTypes", the kinds of input it
/// accepts ("Video", "Screen", "Audio", "File", in exactly this spelling), and "isFolder", true or 1 when it takes a
/// folder of files.
///
/// A pure function each; nothing is kept, no server is asked. Any thread. What is absent or of another type counts as
/// not there: a workflow without a list of sources has none, and a source that is no dictionary or has no list of types
/// supports nothing.
namespace LMRWorkflowAdditions {

/// One camera recording.
LUMORA_EXPORT bool acceptsVideo(const lumora::Dictionary& workflow);
/// One screen recording.
LUMORA_EXPORT bool acceptsScreen(const lumora::Dictionary& workflow);
/// One recording of sound alone.
LUMORA_EXPORT bool acceptsAudio(const lumora::Dictionary& workflow);
/// Two recordings at once, each of a camera or of a screen. Sources of sound or files do not count here, although
/// workflowType() counts them.
LUMORA_EXPORT bool acceptsDual(const lumora::Dictionary& workflow);
/// True: no content type is refused.
LUMORA_EXPORT bool supportsFileContentType(const lumora::Dictionary& workflow, std::string_view contentType);

/// What kind of recording the workflow takes, by the number and the types of its sources.
LUMORA_EXPORT LMRWorkflowType workflowType(const lumora::Dictionary& workflow);

} // namespace LMRWorkflowAdditions
