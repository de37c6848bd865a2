#include <LumoraKit/workflows/LMRWorkflowAdditions.h>
#include <LumoraKit/workflows/LMRWorkflowAdditionsInternal.h>

#include <algorithm>
#include <initializer_list>

namespace Internal = LMRWorkflowAdditionsInternal;

namespace {

constexpr std::string_view video = "Video";
constexpr std::string_view screen = "Screen";
constexpr std::string_view audio = "Audio";
constexpr std::string_view file = "File";

bool supportsAny(const lumora::Dictionary& workflow, std::int64_t index,
                 std::initializer_list<std::string_view> sourceTypes) {
  return std::ranges::any_of(sourceTypes, [&workflow, index](std::string_view sourceType) {
    return Internal::supportsSourceType_forSourceAtIndex(workflow, sourceType, index);
  });
}

LMRWorkflowType singleSourceType(const lumora::Dictionary& workflow) {
  if (Internal::anySourceRequiresFolderSubmission(workflow)) {
    return supportsAny(workflow, 0, {file}) ? LMRWorkflowTypeFolder : LMRWorkflowTypeUnsupported;
  }
  return supportsAny(workflow, 0, {video, audio, screen, file}) ? LMRWorkflowTypeSingleSource
                                                                : LMRWorkflowTypeUnsupported;
}

LMRWorkflowType dualSourceType(const lumora::Dictionary& workflow) {
  const bool fits = !Internal::anySourceRequiresFolderSubmission(workflow) &&
                    supportsAny(workflow, 0, {video, screen, file, audio}) &&
                    supportsAny(workflow, 1, {video, screen, file, audio});
  return fits ? LMRWorkflowTypeDualSource : LMRWorkflowTypeUnsupported;
}

} // namespace

namespace LMRWorkflowAdditions {

bool acceptsVideo(const lumora::Dictionary& workflow) {
  return Internal::singleSourceAndSupportsSourceType(workflow, video);
}

bool acceptsScreen(const lumora::Dictionary& workflow) {
  return Internal::singleSourceAndSupportsSourceType(workflow, screen);
}

bool acceptsAudio(const lumora::Dictionary& workflow) {
  return Internal::singleSourceAndSupportsSourceType(workflow, audio);
}

bool acceptsDual(const lumora::Dictionary& workflow) {
  return Internal::numberOfSources(workflow) == 2 && !Internal::anySourceRequiresFolderSubmission(workflow) &&
         supportsAny(workflow, 0, {video, screen}) && supportsAny(workflow, 1, {video, screen});
}

bool supportsFileContentType(const lumora::Dictionary& /*workflow*/, std::string_view /*contentType*/) {
  return true;
}

LMRWorkflowType workflowType(const lumora::Dictionary& workflow) {
  switch (Internal::numberOfSources(workflow)) {
  case 1:
    return singleSourceType(workflow);
  case 2:
    return dualSourceType(workflow);
  default:
    return LMRWorkflowTypeUnsupported;
  }
}

} // namespace LMRWorkflowAdditions
