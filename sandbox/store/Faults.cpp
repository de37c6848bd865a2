#include "Faults.h"

#include <algorithm>
#include <array>

namespace lumora::sandbox {

namespace {

constexpr std::array<std::string_view, 7> kindNames{"latency", "failure", "garbage", "hang",
                                                    "crash",   "partial", "stall"};

Fault::Kind kindNamed(const std::string& name) {
  std::size_t index = 0;
  while (kindNames.at(index) != name) {
    ++index;
  }
  return static_cast<Fault::Kind>(index);
}

Fault faultFrom(SQLite::Statement& row) {
  return {row.getColumn(0).getInt64(), row.getColumn(1).getString(),   kindNamed(row.getColumn(2).getString()),
          row.getColumn(3).getInt64(), optionalText(row.getColumn(4)), optionalNumber(row.getColumn(5))};
}

std::vector<Fault> faultsFrom(SQLite::Statement row) {
  std::vector<Fault> all;
  while (row.executeStep()) {
    all.push_back(faultFrom(row));
  }
  return all;
}

std::vector<Fault> faultsFor(Store& store, const std::string& command) {
  return faultsFrom(store.query("SELECT id, command, kind, value, message, remaining FROM faults "
                                "WHERE command = ?1 OR command = '*' AND ?1 <> ?2 ORDER BY id",
                                command, std::string(transferName)));
}

bool isCounted(const Fault& fault) {
  return fault.remaining.has_value();
}

} // namespace

std::string_view nameOf(Fault::Kind kind) {
  return kindNames.at(static_cast<std::size_t>(kind));
}

void addFault(Store& store, const Fault& fault) {
  store.execute("INSERT INTO faults (command, kind, value, message, remaining) VALUES (?, ?, ?, ?, ?)", fault.command,
                std::string(nameOf(fault.kind)), fault.value, fault.message, fault.remaining);
}

void clearFaults(Store& store) {
  store.execute("DELETE FROM faults");
}

std::vector<Fault> faults(Store& store) {
  return faultsFrom(store.query("SELECT id, command, kind, value, message, remaining FROM faults ORDER BY id"));
}

std::vector<Fault> takeFaults(Store& store, const std::string& command) {
  // No write lock is taken where nothing is counted: many runs at once would wait for one another.
  auto struck = faultsFor(store, command);
  if (std::none_of(struck.begin(), struck.end(), isCounted)) {
    return struck;
  }
  store.change([&] {
    struck = faultsFor(store, command);
    for (const auto& fault : struck) {
      store.execute("UPDATE faults SET remaining = remaining - 1 WHERE id = ?", fault.id);
    }
    store.execute("DELETE FROM faults WHERE remaining <= 0");
  });
  return struck;
}

} // namespace lumora::sandbox
