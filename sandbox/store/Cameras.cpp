#include "Cameras.h"

#include <LumoraKit/platform/Files.h>

#include <algorithm>
#include <array>
#include <stdexcept>

namespace lumora::sandbox {

namespace {

constexpr std::array<std::string_view, 4> stateNames{"idle", "starting", "recording", "paused"};

Take takeFrom(SQLite::Statement& row) {
  return {row.getColumn(3).getString(), row.getColumn(4).getString(),     row.getColumn(5).getInt() != 0,
          row.getColumn(6).getInt64(),  optionalNumber(row.getColumn(7)), row.getColumn(8).getInt64()};
}

std::vector<Camera> camerasFrom(SQLite::Statement row) {
  std::vector<Camera> all;
  while (row.executeStep()) {
    all.push_back(
        {row.getColumn(0).getString(), row.getColumn(1).getString(), row.getColumn(2).getInt() != 0, std::nullopt});
    if (!row.getColumn(3).isNull()) {
      all.back().take = takeFrom(row);
    }
  }
  return all;
}

template <class... Values> std::vector<Camera> select(Store& store, const std::string& rest, const Values&... values) {
  const std::string columns =
      "SELECT name, uuid, is_bound, take, user, audio_only, begins, since, recorded FROM cameras ";
  return camerasFrom(store.query((columns + rest).c_str(), values...));
}

std::optional<Camera> firstOf(const std::vector<Camera>& cameras) {
  return cameras.empty() ? std::nullopt : std::optional(cameras.front());
}

} // namespace

std::string_view nameOf(CameraState state) {
  return stateNames.at(static_cast<std::size_t>(state));
}

CameraState stateAt(const Camera& camera, std::int64_t moment) {
  if (!camera.take) {
    return CameraState::Idle;
  }
  if (!camera.take->since) {
    return CameraState::Paused;
  }
  return moment < camera.take->begins ? CameraState::Starting : CameraState::Recording;
}

std::int64_t recordedAt(const Take& take, std::int64_t moment) {
  return take.recorded + (take.since ? std::max<std::int64_t>(moment - *take.since, 0) : 0);
}

void addCamera(Store& store, const std::string& name, bool isBound) {
  if (findCamera(store, name)) {
    throw std::runtime_error("there is a camera named \"" + name + "\" already");
  }
  store.execute("INSERT INTO cameras (name, uuid, is_bound) VALUES (?, ?, ?)", name, makeUUIDString(),
                std::int64_t{isBound});
}

bool removeCamera(Store& store, const std::string& name) {
  const auto camera = findCamera(store, name);
  if (!camera) {
    return false;
  }
  std::error_code ignored;
  std::filesystem::remove(previewPath(store, *camera), ignored);
  return store.execute("DELETE FROM cameras WHERE name = ?", name) > 0;
}

std::vector<Camera> cameras(Store& store) {
  return select(store, "ORDER BY name");
}

std::optional<Camera> findCamera(Store& store, const std::string& name) {
  return firstOf(select(store, "WHERE name = ?", name));
}

std::optional<Camera> boundCamera(Store& store) {
  return firstOf(select(store, "WHERE is_bound"));
}

void saveTake(Store& store, const Camera& camera) {
  if (!camera.take) {
    store.execute("UPDATE cameras SET take = NULL WHERE name = ?", camera.name);
    return;
  }
  const Take& take = *camera.take;
  store.execute("UPDATE cameras SET take = ?, user = ?, audio_only = ?, begins = ?, since = ?, recorded = ? "
                "WHERE name = ?",
                take.uuid, take.user, std::int64_t{take.isAudioOnly}, take.begins, take.since, take.recorded,
                camera.name);
}

std::filesystem::path previewPath(const Store& store, const Camera& camera) {
  return store.previewsFolder() / (camera.uuid + ".png");
}

} // namespace lumora::sandbox
