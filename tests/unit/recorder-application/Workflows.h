#pragma once

#include "recorder/model/Workflow.h"

#include <LumoraKit/LumoraKit.h>

#include <string>
#include <vector>

namespace recorder {

/// A workflow as a server lists it; its UUID is its name.
inline lumora::Dictionary description(const std::string& name, const std::vector<std::vector<std::string>>& sources,
                                      const std::string& title = "") {
  lumora::Array list;
  for (const auto& types : sources) {
    list.push_back(lumora::Dictionary{{"sourceTypes", lumora::Array(types.begin(), types.end())}, {"isFolder", false}});
  }
  return {{"name", name}, {"title", title.empty() ? name : title}, {"uuid", name}, {"sources", list}};
}

inline lumora::Array descriptions() {
  return {description("camera", {{"Video", "File"}}, "Camera"), description("screen", {{"Screen"}}, "Screen"),
          description("sound", {{"Audio"}}, "Sound"), description("both", {{"Video"}, {"Screen"}}, "Camera and screen"),
          description("folder", {{"File"}}, "Folder")};
}

inline std::vector<Workflow> workflows() {
  std::vector<Workflow> all;
  for (const lumora::Value& each : descriptions()) {
    if (auto workflow = Workflow::withDescription(*each.dictionary())) {
      all.push_back(std::move(*workflow));
    }
  }
  return all;
}

} // namespace recorder
