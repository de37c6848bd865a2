#include <LumoraKit/actions/LMRReplyKeys.h>
#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/workflows/LMRWorkflowAdditionsInternal.h>

#include <algorithm>
#include <string>

namespace {

// A flag that is true, or a number equal to it. A text is neither.
bool isTrue(const lumora::Value* flag) {
  return flag != nullptr && flag->real() == 1.0;
}

} // namespace

namespace LMRWorkflowAdditionsInternal {

const lumora::Array* sources(const lumora::Dictionary& workflow) {
  return workflow.array(LMRWorkflowSourcesKey);
}

std::int64_t numberOfSources(const lumora::Dictionary& workflow) {
  const lumora::Array* const all = sources(workflow);
  return all ? static_cast<std::int64_t>(all->size()) : 0;
}

bool supportsSourceType_forSourceAtIndex(const lumora::Dictionary& workflow, std::string_view sourceType,
                                         std::int64_t index) {
  lumora::assertThat(index >= 0 && index < numberOfSources(workflow), "index < self.numberOfSources", __func__,
                     "LMRWorkflowAdditions");
  const auto* const source = (*sources(workflow))[static_cast<std::size_t>(index)].dictionary();
  const auto* const sourceTypes = source ? source->array("sourceTypes") : nullptr;
  return sourceTypes != nullptr && std::ranges::any_of(*sourceTypes, [sourceType](const lumora::Value& supported) {
           const std::string* const word = supported.string();
           return word != nullptr && *word == sourceType;
         });
}

bool singleSourceAndSupportsSourceType(const lumora::Dictionary& workflow, std::string_view sourceType) {
  return numberOfSources(workflow) == 1 && supportsSourceType_forSourceAtIndex(workflow, sourceType, 0) &&
         !anySourceRequiresFolderSubmission(workflow);
}

bool anySourceRequiresFolderSubmission(const lumora::Dictionary& workflow) {
  const lumora::Array* const all = sources(workflow);
  return all != nullptr && std::ranges::any_of(*all, [](const lumora::Value& source) {
           const lumora::Dictionary* const description = source.dictionary();
           return description != nullptr && isTrue(description->find("isFolder"));
         });
}

} // namespace LMRWorkflowAdditionsInternal
