#include "ChildProgram.h"

#include <csignal>
#include <filesystem>

#include <sys/prctl.h>
#include <unistd.h>

namespace lumora::tests {

using backend::GLibPtr;

namespace {

GSubprocessFlags flags = static_cast<GSubprocessFlags>(G_SUBPROCESS_FLAGS_STDIN_PIPE | G_SUBPROCESS_FLAGS_STDOUT_PIPE);

} // namespace

void ChildProgram::silenceErrors() {
  flags = static_cast<GSubprocessFlags>(flags | G_SUBPROCESS_FLAGS_STDERR_SILENCE);
}

std::unique_ptr<ChildProgram> ChildProgram::start(const std::vector<std::string>& commandLine) {
  std::vector<const gchar*> words;
  words.reserve(commandLine.size() + 1);
  for (const auto& word : commandLine) {
    words.push_back(word.c_str());
  }
  words.push_back(nullptr);
  const GLibPtr<GSubprocessLauncher> launcher(g_subprocess_launcher_new(flags));
  // A session of its own keeps Ctrl-C at the terminal from it: who started it ends it.
  g_subprocess_launcher_set_child_setup(
      launcher.get(),
      [](gpointer) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        setsid();
      },
      nullptr, nullptr);
  GLibPtr<GSubprocess> process(g_subprocess_launcher_spawnv(launcher.get(), words.data(), nullptr));
  return process ? std::unique_ptr<ChildProgram>(new ChildProgram(std::move(process))) : nullptr;
}

std::unique_ptr<ChildProgram> ChildProgram::startSelf(std::vector<std::string> arguments) {
  arguments.insert(arguments.begin(), std::filesystem::read_symlink("/proc/self/exe").string());
  return start(arguments);
}

ChildProgram::ChildProgram(GLibPtr<GSubprocess> process)
    : process_(std::move(process)), output_(g_data_input_stream_new(g_subprocess_get_stdout_pipe(process_.get()))) {}

ChildProgram::~ChildProgram() {
  kill();
}

std::string ChildProgram::readLine() {
  const GLibPtr<gchar> line(g_data_input_stream_read_line(output_.get(), nullptr, nullptr, nullptr));
  return line ? line.get() : "";
}

void ChildProgram::writeLine(const std::string& line) {
  const std::string text = line + "\n";
  g_output_stream_write_all(g_subprocess_get_stdin_pipe(process_.get()), text.data(), text.size(), nullptr, nullptr,
                            nullptr);
}

void ChildProgram::signal(int number) {
  g_subprocess_send_signal(process_.get(), number);
}

bool ChildProgram::wait() {
  return g_subprocess_wait_check(process_.get(), nullptr, nullptr) != FALSE;
}

void ChildProgram::kill() {
  g_subprocess_force_exit(process_.get());
  g_subprocess_wait(process_.get(), nullptr, nullptr);
}

} // namespace lumora::tests
