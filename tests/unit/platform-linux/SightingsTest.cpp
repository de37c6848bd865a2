#include <LumoraKit/platform/linux/avahi/Sightings.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

using lumora::backend::ServiceInstance;
using lumora::backend::Sightings;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

const Sightings::Place ethernet{2, 0};
const Sightings::Place ethernetNew{2, 1};
const Sightings::Place wireless{3, 0};

class SightingsTest : public testing::Test {
protected:
  const ServiceInstance studio_{"Studio", "_lumora._tcp", "local"};
  Sightings sightings_;
};

TEST_F(SightingsTest, service_comesWithItsFirstPlaceAndGoesWithItsLast) {
  EXPECT_TRUE(sightings_.add(studio_, ethernet));
  EXPECT_FALSE(sightings_.add(studio_, ethernetNew));
  EXPECT_FALSE(sightings_.add(studio_, wireless));
  EXPECT_FALSE(sightings_.remove(studio_, ethernetNew));
  EXPECT_FALSE(sightings_.remove(studio_, ethernet));
  EXPECT_TRUE(sightings_.remove(studio_, wireless));
  EXPECT_TRUE(sightings_.add(studio_, wireless));
}

TEST_F(SightingsTest, place_countsOnce) {
  EXPECT_TRUE(sightings_.add(studio_, ethernet));
  EXPECT_FALSE(sightings_.add(studio_, ethernet));
  EXPECT_TRUE(sightings_.remove(studio_, ethernet));
  EXPECT_FALSE(sightings_.remove(studio_, ethernet));
}

TEST_F(SightingsTest, removal_isNothing_whereTheServiceWasNotSeen) {
  EXPECT_FALSE(sightings_.remove(studio_, ethernet));
  EXPECT_TRUE(sightings_.add(studio_, ethernet));
  EXPECT_FALSE(sightings_.remove(studio_, wireless));
}

TEST_F(SightingsTest, services_differByNameAndDomain) {
  EXPECT_TRUE(sightings_.add(studio_, ethernet));
  EXPECT_TRUE(sightings_.add({"studio", "_lumora._tcp", "local"}, ethernet));
  EXPECT_TRUE(sightings_.add({"Studio", "_lumora._tcp", "example.org"}, ethernet));
}

TEST_F(SightingsTest, takeAll_forgetsEverything) {
  sightings_.add(studio_, ethernet);
  sightings_.add(studio_, wireless);
  EXPECT_THAT(sightings_.takeAll(), ElementsAre(studio_));
  EXPECT_THAT(sightings_.takeAll(), IsEmpty());
  EXPECT_TRUE(sightings_.add(studio_, ethernet));
}

} // namespace
