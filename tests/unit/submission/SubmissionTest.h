#pragma once

#include "support/ToolArguments.h"

#include <LumoraKit/actions/LMRActionFactory.h>
#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/testing/FakePlatform.h>

#include <gtest/gtest.h>

namespace lumora::tests {

/// Submits with files that are kept in memory.
class SubmissionTest : public testing::Test {
protected:
  /// The first value of the argument with this key; empty when there is none.
  static std::string argument(const LMRAction& action, std::string_view key) {
    const Array arguments = action.arguments().value_or(Array());
    for (const Value& element : arguments) {
      const Array* const words = element.array();
      if (words && words->size() > 1 && *words->at(0).string() == key) {
        return *words->at(1).string();
      }
    }
    return "";
  }

  std::string content(const std::string& path) const { return platform_.files->content(path).value_or("no file"); }

  fakes::FakePlatform platform_;
  std::shared_ptr<LMRSession> session_ = LMRSession::session();
  Dictionary userMetadata_{{std::string(LMREpisodeUserMetadataTitleKey), "Lecture 1"},
                           {std::string(LMREpisodeUserMetadataDescriptionKey), "Introduction"}};
};

} // namespace lumora::tests
