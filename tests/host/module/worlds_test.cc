#include "tests/host/module/module_fixture.h"

namespace StandIn {
namespace {

TEST_F(ModuleTest, TheProcessThatAsksRunsInTheRootDomain) {
  EXPECT_EQ(module_.WorldDomain(100), 0U);
  Make("guestDom");
  EXPECT_EQ(module_.WorldDomain(100), 0U) << "whatever the description says of its number";
  EXPECT_EQ(module_.GetDomainInfo(0)->worldRefCount, 1U);
}

TEST_F(ModuleTest, TheProcessThatAsksCanBePlacedElsewhere) {
  const DomainId app = Make("appDom");
  module_.PlaceWorld(100, app);
  EXPECT_EQ(module_.WorldDomain(100), app);
  EXPECT_EQ(module_.GetDomainInfo(0)->worldRefCount, 0U);
  EXPECT_EQ(module_.GetDomainInfo(app)->worldRefCount, 1U);
}

TEST_F(ModuleTest, AnUnknownWorldHasNoDomain) {
  for (const WorldId world : {5, 0, -1}) {
    EXPECT_EQ(RefusalOf([&] { module_.WorldDomain(world); }),
              "ESRCH: no world has the id " + std::to_string(world));
  }
}

TEST_F(ModuleTest, ADescribedWorldRunsInItsDomainWhileThatExists) {
  EXPECT_EQ(RefusalOf([&] { module_.WorldDomain(4711); }), "ESRCH: no world has the id 4711");
  const DomainId guest = Make("guestDom");
  EXPECT_EQ(module_.WorldDomain(4711), guest);
  EXPECT_EQ(module_.WorldDomain(4712), guest);
  EXPECT_EQ(module_.GetDomainInfo(guest)->worldRefCount, 2U);
}

TEST_F(ModuleTest, APlacementWinsOverTheDescription) {
  const DomainId guest = Make("guestDom");
  const DomainId app = Make("appDom");
  module_.PlaceWorld(4711, app);
  EXPECT_EQ(module_.WorldDomain(4711), app);
  EXPECT_EQ(module_.GetDomainInfo(guest)->worldRefCount, 1U);
  EXPECT_EQ(module_.GetDomainInfo(app)->worldRefCount, 1U);
}

TEST_F(ModuleTest, APlacedWorldCanBeMoved) {
  const DomainId app = Make("appDom");
  module_.PlaceWorld(7, app);
  module_.PlaceWorld(7, 0);
  EXPECT_EQ(module_.WorldDomain(7), 0U);
  EXPECT_EQ(module_.GetDomainInfo(app)->worldRefCount, 0U);
  EXPECT_EQ(module_.GetDomainInfo(0)->worldRefCount, 2U);
}

TEST_F(ModuleTest, PlacingIsRefusedForAnUnknownDomainOrANumberThatIsNoWorld) {
  EXPECT_EQ(RefusalOf([&] { module_.PlaceWorld(7, 3); }), "ENOENT: no domain has the id 3");
  EXPECT_EQ(RefusalOf([&] { module_.PlaceWorld(0, 0); }), "EINVAL: the world id 0 is not positive");
  EXPECT_EQ(RefusalOf([&] { module_.PlaceWorld(-7, 0); }),
            "EINVAL: the world id -7 is not positive");
}

}  // namespace
}  // namespace StandIn
