#include <LumoraKit/platform/linux/avahi/Sightings.h>

namespace lumora::backend {

bool Sightings::add(const ServiceInstance& service, Place place) {
  const auto [known, isNew] = places_.try_emplace(service);
  known->second.insert(place);
  return isNew;
}

bool Sightings::remove(const ServiceInstance& service, Place place) {
  const auto known = places_.find(service);
  if (known == places_.end() || known->second.erase(place) == 0 || !known->second.empty()) {
    return false;
  }
  places_.erase(known);
  return true;
}

std::vector<ServiceInstance> Sightings::takeAll() {
  std::vector<ServiceInstance> all;
  all.reserve(places_.size());
  for (const auto& [service, places] : places_) {
    all.push_back(service);
  }
  places_.clear();
  return all;
}

} // namespace lumora::backend
