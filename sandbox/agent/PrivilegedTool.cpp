#include "PrivilegedTool.h"

#include <LumoraKit/platform/PropertyList.h>
#include <LumoraKit/platform/Secret.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <memory>
#include <string_view>

#include <grp.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumora::sandbox {

namespace {

using backend::GLibPtr;

/// As long as the framework waits for an agent's reply.
constexpr guint deadlineSeconds = 60;

/// Whoever may configure the machine may have no other command run by the superuser.
constexpr std::array<std::string_view, 3> commands{"setconfig", "bind", "unbind"};

bool isPrivileged(const std::string& command) {
  return std::find(commands.begin(), commands.end(), command) != commands.end();
}

struct Owner {
  uid_t user = 0;
  gid_t group = 0;
};

// Between fork(2) and execve(2). A tool does not outlive its agent.
void becomeOwner(gpointer data) {
  const auto& owner = *static_cast<const Owner*>(data);
  prctl(PR_SET_PDEATHSIG, SIGKILL);
  if (geteuid() == 0 &&
      (setgroups(0, nullptr) != 0 || setgid(owner.group) != 0 || (owner.user != 0 && setuid(owner.user) != 0))) {
    _exit(126);
  }
}

GLibPtr<GSubprocess> start(const std::filesystem::path& root, std::string& failure) {
  struct stat state {};
  if (stat((root / "var/lib/lumora").c_str(), &state) != 0) {
    failure = "there is no server at " + root.string();
    return nullptr;
  }
  const GLibPtr<GSubprocessLauncher> launcher(g_subprocess_launcher_new(static_cast<GSubprocessFlags>(
      G_SUBPROCESS_FLAGS_STDIN_PIPE | G_SUBPROCESS_FLAGS_STDOUT_PIPE | G_SUBPROCESS_FLAGS_STDERR_PIPE)));
  auto* const owner = new Owner{state.st_uid, state.st_gid};
  g_subprocess_launcher_set_child_setup(launcher.get(), &becomeOwner, owner,
                                        [](gpointer data) { delete static_cast<Owner*>(data); });
  GError* error = nullptr;
  GLibPtr<GSubprocess> process(g_subprocess_launcher_spawn(
      launcher.get(), &error, (root / "usr/libexec/lumora/lumexec").c_str(), "--plistin", nullptr));
  if (!process) {
    const GLibPtr<GError> reason(error);
    failure = reason->message;
  }
  return process;
}

/// One run of the tool, which answers for it and ends with it.
struct Run {
  GLibPtr<GSubprocess> process;
  GDBusMethodInvocation& invocation;
  guint deadline = 0;
  bool isLate = false;
};

gboolean endLateRun(gpointer data) {
  auto& run = *static_cast<Run*>(data);
  run.isLate = true;
  run.deadline = 0;
  g_subprocess_force_exit(run.process.get());
  return G_SOURCE_REMOVE;
}

std::string textOf(GBytes* bytes) {
  gsize length = 0;
  const auto* const text = static_cast<const char*>(g_bytes_get_data(bytes, &length));
  return {text, length};
}

int statusOf(GSubprocess& process) {
  constexpr int signalled = 128;
  return g_subprocess_get_if_exited(&process) != FALSE ? g_subprocess_get_exit_status(&process)
                                                       : signalled + g_subprocess_get_term_sig(&process);
}

void answer(Run& run, GBytes* output, GBytes* errors) {
  if (run.isLate) {
    return replyError(run.invocation, failedError, "the tool did not end in time");
  }
  const Dictionary reply{{"terminationStatus", statusOf(*run.process)},
                         {"standardOutput", textOf(output)},
                         {"standardError", textOf(errors)}};
  const auto text = xmlDescription(reply);
  if (!text) {
    return replyError(run.invocation, failedError, "the tool's output is no text");
  }
  replyText(run.invocation, *text);
}

void end(GObject* process, GAsyncResult* result, gpointer data) {
  const std::unique_ptr<Run> run(static_cast<Run*>(data));
  if (run->deadline != 0) {
    g_source_remove(run->deadline);
  }
  GBytes* output = nullptr;
  GBytes* errors = nullptr;
  GError* reason = nullptr;
  if (g_subprocess_communicate_finish(G_SUBPROCESS(process), result, &output, &errors, &reason) == FALSE) {
    const GLibPtr<GError> error(reason);
    return replyError(run->invocation, failedError, error->message);
  }
  answer(*run, output, errors);
  g_bytes_unref(output);
  g_bytes_unref(errors);
}

/// The text's bytes, which are overwritten when nobody needs them any more: a password may be in them.
GBytes* secretBytes(std::string text) {
  auto* const secret = new Secret(std::move(text));
  return g_bytes_new_with_free_func(
      secret->text().data(), secret->text().size(), [](gpointer data) { delete static_cast<Secret*>(data); }, secret);
}

} // namespace

std::optional<Array> toolRequest(const std::string& command, const Dictionary& request) {
  const Array* const subarguments = request.array("subarguments");
  if (subarguments == nullptr) {
    return std::nullopt;
  }
  Array elements;
  if (request.contains("server")) {
    const auto server = request.string("server");
    const auto user = request.string("user");
    const auto password = request.string("pass");
    if (!server || !user || !password) {
      return std::nullopt;
    }
    elements = {Array{"server", *server}, Array{"auth", "Password"}, Array{"user", *user}, Array{"pass", *password}};
  }
  elements.emplace_back(command);
  elements.insert(elements.end(), subarguments->begin(), subarguments->end());
  return elements;
}

void PrivilegedTool::perform(const AgentCall& call, GDBusMethodInvocation& invocation) const {
  const auto request = dictionaryWithXMLDescription(call.request);
  const auto elements = request ? toolRequest(call.subject, *request) : std::nullopt;
  auto input = elements ? xmlDescription(*elements) : std::nullopt;
  if (!isPrivileged(call.subject) || !input) {
    return replyError(invocation, invalidArgumentsError,
                      input ? "it performs no command named " + call.subject : "the request is not as it should be");
  }
  std::string failure;
  auto process = start(root_, failure);
  if (!process) {
    return replyError(invocation, failedError, failure);
  }
  auto* const run = new Run{std::move(process), invocation};
  run->deadline = g_timeout_add_seconds(deadlineSeconds, &endLateRun, run);
  GBytes* const bytes = secretBytes(std::move(*input));
  g_subprocess_communicate_async(run->process.get(), bytes, nullptr, &end, run);
  g_bytes_unref(bytes);
}

} // namespace lumora::sandbox
