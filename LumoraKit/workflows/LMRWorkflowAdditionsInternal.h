#pragma once

#include <LumoraKit/platform/Value.h>

#include <cstdint>
#include <string_view>

/// What the queries on workflow descriptions are made of.
namespace LMRWorkflowAdditionsInternal {

/// The list of sources; null when there is none.
LUMORA_INTERNAL const lumora::Array* sources(const lumora::Dictionary& workflow);
LUMORA_INTERNAL std::int64_t numberOfSources(const lumora::Dictionary& workflow);
/// Whether a source accepts a kind of input. The index must be one of a source (asserted).
LUMORA_INTERNAL bool supportsSourceType_forSourceAtIndex(const lumora::Dictionary& workflow,
                                                         std::string_view sourceType, std::int64_t index);
/// Whether the workflow takes one recording of this kind.
LUMORA_INTERNAL bool singleSourceAndSupportsSourceType(const lumora::Dictionary& workflow, std::string_view sourceType);
/// Whether any source takes a folder of files.
LUMORA_INTERNAL bool anySourceRequiresFolderSubmission(const lumora::Dictionary& workflow);

} // namespace LMRWorkflowAdditionsInternal
