#include "support/Descriptors.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/SystemLog.h>

#include <gmock/gmock.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace lumora::tests {
namespace {

using backend::FileDescriptor;
using backend::SystemLog;
using testing::EndsWith;
using testing::MatchesRegex;

// A log daemon: it gets datagrams and reads them when it is asked to.
class Daemon {
public:
  explicit Daemon(const std::string& path) : socket_(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0)) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    path.copy(address.sun_path, sizeof address.sun_path - 1);
    unlink(path.c_str());
    EXPECT_EQ(bind(socket_.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
  }

  // The next record; nothing when none has come.
  std::optional<std::string> read() {
    std::string record(256 * 1024, '\0');
    const ssize_t size = recv(socket_.get(), record.data(), record.size(), MSG_DONTWAIT);
    if (size < 0) {
      return std::nullopt;
    }
    record.resize(static_cast<std::size_t>(size));
    return record;
  }

  std::vector<std::string> readAll() {
    std::vector<std::string> records;
    while (auto record = read()) {
      records.push_back(std::move(*record));
    }
    return records;
  }

private:
  FileDescriptor socket_;
};

class SystemLogTest : public testing::Test {
protected:
  TemporaryFolder folder_;
  std::string path_ = (folder_ / "log").string();
  SystemLog log_{path_};
};

TEST_F(SystemLogTest, sendsRecordInFormatOfSyslog) {
  Daemon daemon(path_);
  log_.write("Error 26 for submit: ü");
  const std::string head = "<13>[A-Z][a-z][a-z] [ 0-9][0-9] [0-9]{2}:[0-9]{2}:[0-9]{2} unit-platform-linux\\[";
  EXPECT_THAT(daemon.read().value_or(""),
              MatchesRegex(head + std::to_string(getpid()) + "\\]: Error 26 for submit: ü"));
}

TEST_F(SystemLogTest, keepsOrder) {
  Daemon daemon(path_);
  for (const char* const line : {"one", "two", "three"}) {
    log_.write(line);
  }
  EXPECT_THAT(daemon.readAll(), testing::ElementsAre(EndsWith(": one"), EndsWith(": two"), EndsWith(": three")));
}

TEST_F(SystemLogTest, dropsLines_whenThereIsNoDaemon) {
  const auto descriptors = openDescriptors();
  log_.write("lost");
  log_.write("lost as well");
  EXPECT_EQ(openDescriptors(), descriptors);
  Daemon daemon(path_);
  log_.write("line");
  EXPECT_THAT(daemon.readAll(), testing::ElementsAre(EndsWith(": 2 log lines were dropped"), EndsWith(": line")));
}

TEST_F(SystemLogTest, findsDaemonAgain_whenThatWasStartedAnew) {
  auto daemon = std::make_unique<Daemon>(path_);
  log_.write("one");
  daemon = std::make_unique<Daemon>(path_);
  log_.write("two");
  EXPECT_THAT(daemon->readAll(), testing::ElementsAre(EndsWith(": two")));
}

// The outcome is that the test ends at all: nobody reads for as long as it writes.
TEST_F(SystemLogTest, dropsLinesAndTellsTheirNumber_whenDaemonDoesNotRead) {
  Daemon daemon(path_);
  constexpr std::size_t written = 5000;
  for (std::size_t i = 0; i < written; ++i) {
    log_.write("line");
  }
  const auto received = daemon.readAll().size();
  EXPECT_LT(received, written);
  log_.write("after");
  const auto records = daemon.readAll();
  ASSERT_EQ(records.size(), 2U);
  EXPECT_THAT(records[0], EndsWith(": " + std::to_string(written - received) + " log lines were dropped"));
  EXPECT_THAT(records[1], EndsWith(": after"));
}

TEST_F(SystemLogTest, cutsLine_whenItIsVeryLong) {
  Daemon daemon(path_);
  log_.write(std::string(std::size_t{10} << 20U, 'x'));
  const auto record = daemon.read();
  ASSERT_TRUE(record);
  EXPECT_GT(record->size(), 60'000U);
}

TEST_F(SystemLogTest, dropsLines_whenPathIsTooLongForSocket) {
  SystemLog log((folder_ / std::string(200, 'x')).string());
  log.write("lost");
}

} // namespace
} // namespace lumora::tests
