#include "FaultyCalls.h"

#include "Interposing.h"

#include <string_view>
#include <system_error>

namespace lumora::tests {
namespace {

std::atomic<Fault*> current = nullptr;
std::atomic<std::size_t> calls = 0;

} // namespace

int faultOf(const char* function, std::initializer_list<int> ways) {
  Fault* const fault = current;
  if (!fault) {
    return none;
  }
  fault->noteCalled(function);
  if (std::string_view(fault->function) != function || ++calls != fault->call) {
    return none;
  }
  fault->ways = ways.size();
  const int error = ways.begin()[fault->way % ways.size()];
  fault->error = error;
  fault->happened = true;
  return error;
}

bool isFailing() {
  return current.load() != nullptr;
}

std::string Fault::description() const {
  const std::string what = error == onlyAPart ? "only a part" : std::generic_category().message(error);
  return call == 0 ? "no call failed" : std::string(function) + ", call " + std::to_string(call) + ": " + what;
}

std::vector<const char*> Fault::called() const {
  std::vector<const char*> names;
  for (std::size_t i = 0; i < called_.size() && called_[i]; ++i) {
    names.push_back(called_[i]);
  }
  return names;
}

void Fault::noteCalled(const char* name) {
  for (auto& place : called_) {
    const char* expected = nullptr;
    if (place.compare_exchange_strong(expected, name) || std::string_view(expected) == name) {
      return;
    }
  }
}

void letFail(Fault& fault) {
  calls = 0;
  current = &fault;
}

void letSucceed() {
  current = nullptr;
}

WithoutFaults::WithoutFaults() : paused_(current.exchange(nullptr)) {}

WithoutFaults::~WithoutFaults() {
  current = paused_;
}

} // namespace lumora::tests
