#include "TicketProgram.h"

#include "Status.h"
#include "store/SingleSignOn.h"

#include <array>
#include <vector>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace {

[[noreturn]] void fail(const std::string& reason) {
  throw Refusal(Status::UnknownServerError, reason);
}

pid_t start(const std::string& program, std::vector<std::string> arguments, int output) {
  std::vector<char*> vector;
  vector.reserve(arguments.size() + 1);
  for (auto& argument : arguments) {
    vector.push_back(argument.data());
  }
  vector.push_back(nullptr);
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, output, STDOUT_FILENO);
  pid_t process = -1;
  const int error = posix_spawn(&process, program.c_str(), &actions, nullptr, vector.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  if (error != 0) {
    fail(program + " cannot be run");
  }
  return process;
}

std::string readLine(int descriptor) {
  std::string text;
  std::array<char, 4096> buffer{};
  for (ssize_t count = 0; (count = read(descriptor, buffer.data(), buffer.size())) > 0;) {
    text.append(buffer.data(), static_cast<std::size_t>(count));
  }
  return text.substr(0, text.find('\n'));
}

/// Runs the program that lies beside this one, which always ends within seconds, and gives its line.
std::string runTicketProgram(const std::vector<std::string>& words) {
  const std::string program =
      std::filesystem::read_symlink("/proc/self/exe").replace_filename("lumora-sandbox-ticket").string();
  std::array<int, 2> pipe{};
  if (pipe2(pipe.data(), O_CLOEXEC) != 0) {
    fail("there are no descriptors");
  }
  std::vector<std::string> arguments{program};
  arguments.insert(arguments.end(), words.begin(), words.end());
  const pid_t process = start(program, arguments, pipe[1]);
  close(pipe[1]);
  std::string line = readLine(pipe[0]);
  close(pipe[0]);
  int status = 0;
  waitpid(process, &status, 0);
  if (!WIFEXITED(status)) {
    fail("the ticket could not be checked");
  }
  if (WEXITSTATUS(status) != 0) {
    throw Refusal(static_cast<Status>(WEXITSTATUS(status)), line);
  }
  return line;
}

} // namespace

std::string serviceInKeytab(const std::filesystem::path& keytab) {
  return runTicketProgram({"keytab", keytab.string()});
}

User userWithTicket(Store& store) {
  const auto service = singleSignOnService(store);
  if (!service) {
    throw Refusal(Status::NotAuthorized, "the server offers no single sign-on");
  }
  const std::string principal = runTicketProgram({"check", keytabPath(store).string(), *service});
  const auto name = userOfPrincipal(store, principal);
  const auto user = name ? findUser(store, *name) : std::nullopt;
  if (!user) {
    throw Refusal(Status::NotAuthorized, "the principal " + principal + " is no user of this server");
  }
  return *user;
}

} // namespace lumora::sandbox
