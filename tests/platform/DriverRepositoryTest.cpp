#include "CDriverRepository.h"

#include <gtest/gtest.h>

#include "CDriver.h"
#include "IInfo.h"
#include "SystemRepository.h"

namespace {

int g_driversDestroyed = 0;
int g_repositoriesDestroyed = 0;

UUID const& testDID() {
  static UUID const id("5b0e4c8e-3f1a-4d52-9c41-7a2f0b6d9e13", "DID_Test");
  return id;
}

// A driver that, like the masters, builds its name once constructed.
class CTestDriver : public CInherit<CTestDriver, CDriver, IInfo> {
 public:
  CTestDriver() : CInherit(testDID(), String(), nullptr) {
    String name;
    IDriver::BUILD_DRIVER_NAME(name, "test-driver", 0, 0, 0xFFFFFFFF, "", "", "", "");
    setDriverName(name);
  }
  ~CTestDriver() override { ++g_driversDestroyed; }

  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int,
                         unsigned int,
                         unsigned int,
                         unsigned int,
                         String const&) const override {
    return info;
  }
};

class CCountedRepository : public CDriverRepository {
 public:
  ~CCountedRepository() override { ++g_repositoriesDestroyed; }
};

class DriverRepositoryTest : public testing::Test {
 protected:
  void SetUp() override {
    g_driversDestroyed = 0;
    g_repositoriesDestroyed = 0;
    ASSERT_TRUE(m_repository->registerDriver(m_driver.get()).isSuccess());
  }
  void TearDown() override { SYSTEM::SET_DRIVER_REPOSITORY(nullptr); }

  String const& name() const { return m_driver->getDriverName(); }

  RefPtr<CCountedRepository> m_repository = adoptRef(new CCountedRepository);
  RefPtr<CTestDriver> m_driver = adoptRef(new CTestDriver);
};

TEST_F(DriverRepositoryTest, RegisteredDriverAnswersByItsFullNameOnlyAndPointsAtTheRepository) {
  void* raw = nullptr;
  ASSERT_TRUE(m_repository->getDriverIf(name(), IInfo::IID(), &raw).isSuccess());
  RefPtr<IInfo> const info = adoptRef(static_cast<IInfo*>(raw));
  EXPECT_EQ(info.get(), static_cast<IInfo*>(m_driver.get()));
  EXPECT_EQ(m_driver->getDriverRepository(), static_cast<IDriverRepository*>(m_repository.get()));
  raw = this;
  EXPECT_TRUE(m_repository->getDriverIf("test-driver", IDriver::IID(), &raw).isFailure()) << "a base name";
  EXPECT_EQ(raw, nullptr);
}

TEST_F(DriverRepositoryTest, SecondDriverUnderTheSameNameIsRefused) {
  RefPtr<CTestDriver> const twin = adoptRef(new CTestDriver);
  EXPECT_TRUE(m_repository->registerDriver(twin.get()).isFailure());
  EXPECT_EQ(twin->getDriverRepository(), nullptr);
  RefPtr<IDriver> found;
  ASSERT_TRUE(adoptInterface(found, [&](UUID const& iid, void** raw) {
                return m_repository->getDriverIf(name(), iid, raw);
              }).isSuccess());
  EXPECT_EQ(found.get(), static_cast<IDriver*>(m_driver.get()));
}

TEST_F(DriverRepositoryTest, UnregisteringReleasesAndDetachesTheDriver) {
  CTestDriver* const driver = m_driver.get();
  driver->addRef();
  m_driver = nullptr;
  m_repository->unregisterDriver(driver->getDriverName());
  EXPECT_EQ(driver->getDriverRepository(), nullptr);
  EXPECT_EQ(g_driversDestroyed, 0);
  driver->release();
  EXPECT_EQ(g_driversDestroyed, 1);
}

TEST_F(DriverRepositoryTest, DyingRepositoryReleasesAndDetachesItsDrivers) {
  m_repository = nullptr;
  EXPECT_EQ(m_driver->getDriverRepository(), nullptr);
  EXPECT_EQ(g_driversDestroyed, 0);
  m_driver = nullptr;
  EXPECT_EQ(g_driversDestroyed, 1);
}

TEST_F(DriverRepositoryTest, SystemHoldsTheInstalledRepositoryUntilItIsRemoved) {
  SYSTEM::SET_DRIVER_REPOSITORY(m_repository.get());
  m_repository = nullptr;
  EXPECT_EQ(g_repositoriesDestroyed, 0);
  void* raw = nullptr;
  ASSERT_TRUE(SYSTEM::DRIVER_REPOSITORY()->getDriverIf(name(), IDriver::IID(), &raw).isSuccess());
  static_cast<IDriver*>(raw)->release();
  SYSTEM::SET_DRIVER_REPOSITORY(nullptr);
  EXPECT_EQ(SYSTEM::DRIVER_REPOSITORY(), nullptr);
  EXPECT_EQ(g_repositoriesDestroyed, 1);
}

}  // namespace
