// The examples about server operations.

#include <LumoraKit/LumoraKit.h>

#include <memory>
#include <string>

namespace snippets {

struct StatusLine {
  void setText(const std::string& text);
};

class Window {
public:
  void listedWorkflowsWithAction(const std::shared_ptr<LMRAction>& action);
  void failedToListWorkflowsWithAction(const std::shared_ptr<LMRAction>& action);
};

void report(const std::string& sentence);

void withoutBlocking(const std::shared_ptr<LMRSession>& session, const std::shared_ptr<Window>& window,
                     StatusLine* statusLine) {
  auto action = LMRActionFactory::actionToListWorkflowsWithSession(session);
  action->setFinishTarget_selector(window, &Window::listedWorkflowsWithAction);
  action->setErrorTarget_selector(window, &Window::failedToListWorkflowsWithAction);
  statusLine->setText(action->description()); // "Getting workflows…"
  action->start();
}

void onAThreadThatMayBlock(const std::shared_ptr<LMRAction>& action) {
  action->runSynchronously();
  if (const LMRErrorRef error = action->error()) {
    return report(error->localizedDescription());
  }
  const auto reply = action->result(); // null when the tool's reply could not be read
}

void privileged(const std::shared_ptr<LMRSession>& session) {
  LMRErrorRef error;
  const auto authorization = lumora::Platform::current().helperAgent->authorize(
      std::string(LMRHelperAgentIdentifier), KTHelperAgentDomainSystem, "org.vantor.lumagentconfigd.configure", &error);
  if (!authorization) { // refused, or there is no agent; the user may have been asked for a password
    return report(error->localizedDescription());
  }
  auto action = LMRActionFactory::actionToBindCamera_session_authorization("Studio A", session, &*authorization);
  action->runSynchronously(); // the authorization must live as long as the action runs
}

class Recorder {
public:
  void startedWithAction(const std::shared_ptr<LMRAction>& action);
  void failedWithAction(const std::shared_ptr<LMRAction>& action);
};

void startedAndSynchronous(const std::shared_ptr<LMRAction>& action, const std::shared_ptr<Recorder>& recorder) {
  action->setFinishTarget_selector(recorder, &Recorder::startedWithAction);
  action->setErrorTarget_selector(recorder, &Recorder::failedWithAction);
  action->start();

  action->runSynchronously();
  if (action->error()) {
    report(action->error()->localizedDescription());
  }
}

// threads.md
void servesTheMainThread(const std::shared_ptr<LMRSession>& session) {
  const auto action = LMRActionFactory::actionToListWorkflowsWithSession(session);
  action->start();
  lumora::Platform::current().mainThread->serveUntil([&] { return !action->isRunning(); });
}

} // namespace snippets
