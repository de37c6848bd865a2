#include "Actions.h"

#include "Stage.h"

namespace stage {

void fail(const std::string& step, const LMRErrorRef& error) {
  throw Failure{step + (error ? ": " + error->localizedDescription() : "") + "."};
}

// Every server operation is an action: it is started, and its end is told on the main thread.
void runAction(const KTActionRef& action) {
  action->start();
  waitUntil([&] { return !action->isRunning(); }, [&] { return action->description(); });
  if (action->error()) {
    fail(action->description(), action->error());
  }
}

std::vector<lumora::Dictionary> listed(const std::shared_ptr<LMRAction>& list, std::string_view key) {
  runAction(list);
  const auto reply = list->result();
  const lumora::Array* const entries = reply ? reply->array(key) : nullptr;
  std::vector<lumora::Dictionary> dictionaries;
  for (const lumora::Value& entry : entries ? *entries : lumora::Array()) {
    dictionaries.push_back(entry.dictionary() ? *entry.dictionary() : lumora::Dictionary());
  }
  return dictionaries;
}

} // namespace stage
