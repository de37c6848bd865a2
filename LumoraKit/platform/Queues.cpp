#include <LumoraKit/platform/Queues.h>

namespace lumora {

WorkQueue::~WorkQueue() = default;

Queues::~Queues() = default;

} // namespace lumora
