#include "Recordings.h"

#include <LumoraKit/platform/Files.h>

#include <algorithm>

namespace lumora::sandbox {

Recording createRecording(Store& store, const Workflow& workflow, const User& user) {
  Recording recording{makeUUIDString(), {}};
  const std::size_t places = std::max<std::size_t>(workflow.sources.size(), 1);
  std::generate_n(std::back_inserter(recording.submissionUUIDs), places, makeUUIDString);

  store.change([&] {
    store.execute("INSERT INTO recordings VALUES (?, ?, ?, ?, ?)", recording.uuid, workflow.uuid, workflow.name,
                  user.name, currentTime());
    std::int64_t position = 0;
    for (const auto& uuid : recording.submissionUUIDs) {
      store.execute("INSERT INTO slots VALUES (?, ?, ?)", uuid, recording.uuid, position++);
    }
  });
  return recording;
}

std::optional<Slot> findSlot(Store& store, const std::string& submissionUUID) {
  auto row = store.query("SELECT recording_uuid, position, r.workflow_uuid, r.workflow_name, r.user, "
                         "EXISTS (SELECT 1 FROM episodes WHERE slot_uuid = s.uuid) "
                         "FROM slots s JOIN recordings r ON r.uuid = recording_uuid WHERE s.uuid = ?",
                         submissionUUID);
  if (!row.executeStep()) {
    return std::nullopt;
  }
  return Slot{submissionUUID,
              row.getColumn(0).getString(),
              row.getColumn(1).getInt64(),
              row.getColumn(2).getString(),
              row.getColumn(3).getString(),
              row.getColumn(4).getString(),
              row.getColumn(5).getInt() != 0};
}

} // namespace lumora::sandbox
