#include "Invocation.h"

#include "store/Store.h"

#include <array>

#include <sys/auxv.h>

namespace lumora::sandbox {

namespace fs = std::filesystem;

namespace {

struct Place {
  ToolKind tool;
  const char* path;
};

constexpr std::array<Place, 3> places{{{ToolKind::Main, "usr/bin/lumctl"},
                                       {ToolKind::Exec, "usr/libexec/lumora/lumexec"},
                                       {ToolKind::Action, "usr/bin/lumaction"}}};

std::optional<Place> placeNamed(const fs::path& name) {
  for (const auto& place : places) {
    if (fs::path(place.path).filename() == name) {
      return place;
    }
  }
  return std::nullopt;
}

/// The folder from which the place leads to the path; empty when the path lies elsewhere.
fs::path rootOf(fs::path path, const Place& place) {
  const fs::path relative(place.path);
  const fs::path original = path;
  for (auto part = relative.begin(); part != relative.end(); ++part) {
    path = path.parent_path();
  }
  return path / relative == original ? path : fs::path();
}

/// A tool may be reached through further links (/usr/bin/lumctl to one in a root): the first path with a server's
/// state beside it counts.
fs::path findRoot(fs::path path, const Place& place) {
  constexpr int mostLinks = 40;
  for (int links = 0; links < mostLinks; ++links) {
    fs::path root = rootOf(path, place);
    if (!root.empty() && Store::existsAt(root)) {
      return root;
    }
    std::error_code error;
    const fs::path target = fs::read_symlink(path, error);
    if (error) {
      break;
    }
    path = (path.parent_path() / target).lexically_normal();
  }
  return {};
}

} // namespace

Invocation Invocation::fromPath(const fs::path& path) {
  Invocation invocation{path.filename().string(), std::nullopt, {}};
  if (const auto place = placeNamed(path.filename())) {
    invocation.tool = place->tool;
    invocation.root = findRoot(fs::absolute(path).lexically_normal(), *place);
  }
  return invocation;
}

Invocation Invocation::current() {
  // The path given to execve(2): unlike argv[0] it cannot lie, unlike /proc/self/exe it keeps the link's name.
  return fromPath(reinterpret_cast<const char*>(getauxval(AT_EXECFN)));
}

void installTools(const fs::path& root, const fs::path& program) {
  for (const auto& place : places) {
    const fs::path tool = root / place.path;
    fs::create_directories(tool.parent_path());
    if (fs::is_symlink(tool)) {
      fs::remove(tool);
    }
    fs::create_symlink(program, tool);
  }
}

} // namespace lumora::sandbox
