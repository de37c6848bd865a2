#pragma once

#include <LumoraKit/platform/Export.h>
#include <LumoraKit/platform/linux/avahi/ServiceInstance.h>

#include <map>
#include <set>
#include <tuple>
#include <vector>

namespace lumora::backend {

/// Where services are seen at the moment: the daemon tells of each once for every network and protocol.
class LUMORA_INTERNAL Sightings {
public:
  struct Place {
    int interface = 0;
    int protocol = 0;

    bool operator<(const Place& other) const {
      return std::tie(interface, protocol) < std::tie(other.interface, other.protocol);
    }
  };

  /// True when it was seen nowhere before.
  bool add(const ServiceInstance& service, Place place);
  /// True when it was seen there, and is seen nowhere any more.
  bool remove(const ServiceInstance& service, Place place);
  /// Forgets all, and gives them.
  std::vector<ServiceInstance> takeAll();

private:
  std::map<ServiceInstance, std::set<Place>> places_;
};

} // namespace lumora::backend
