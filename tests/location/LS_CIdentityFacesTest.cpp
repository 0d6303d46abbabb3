// The faces of an identity: made, found, inherited and removed through the
// identity, and turned into events to the identity's face observers.

#include <gtest/gtest.h>

#include <string>

#include "LS_ClassIdentifiers.h"
#include "LS_IAuthentication.h"
#include "LS_ICall.h"
#include "LS_IInbound.h"
#include "LS_IMwiSubscriptionConfig.h"
#include "LS_IOutbound.h"
#include "LS_IRegistrationOutboundConfig.h"
#include "LocationFixture.h"
#include "support/LogCapture.h"

namespace {

using Face = RefPtr<IUnknown>;
using Kind = LS_IdentityFace::Type;

Face faceOf(LS_IIdentity* identity, Kind kind) {
  Face face;
  LS_getFaceIf(identity, kind, face);
  return face;
}
Face configFaceOf(LS_IIdentityConfig* identity, Kind kind) {
  return handedOut([&](UUID const& iid, void** out) { return identity->getConfigFaceIf(kind, iid, out); });
}
template <class T = IUnknown>
RefPtr<T> createConfigFace(LS_IIdentityConfig* identity, Kind kind) {
  return handedOut<T>(
      [&](UUID const& iid, void** out) { return identity->createConfigFaceIf(kind, iid, out); });
}
Face createDynamicFace(LS_IIdentity* identity, Kind kind) {
  return handedOut(
      [&](UUID const& iid, void** out) { return identity->createDynamicFaceIf(kind, iid, out); });
}

// Whether the face of kind answers each of Interfaces.
template <class... Interfaces>
bool answers(LS_IIdentity* identity, Kind kind) {
  auto const answersOne = [&](auto typed) { return LS_getFaceIf(identity, kind, typed).isSuccess(); };
  return (answersOne(RefPtr<Interfaces>()) && ...);
}

struct FaceKind {
  char const* name;
  Kind kind;
  bool (*isOfItsClass)(LS_IIdentity* identity, Kind kind);
};

class IdentityFaceTest : public LocationTest, public ::testing::WithParamInterface<FaceKind> {};

TEST_P(IdentityFaceTest, IsCreatedFoundInheritedAndRemovedThroughTheIdentity) {
  Kind const kind = GetParam().kind;
  RefPtr<LS_IIdentityConfig> const base = group("group");
  RefPtr<LS_IIdentityConfig> const alice = identity("alice", "group");
  RefPtr<LS_IIdentity> const view = runtime(alice);

  Face const baseFace = createConfigFace(base.get(), kind);
  ASSERT_TRUE(baseFace);
  EXPECT_EQ(createConfigFace(base.get(), kind), baseFace);
  Face const inherited = faceOf(view.get(), kind);
  EXPECT_TRUE(inherited && inherited != baseFace);
  EXPECT_FALSE(configFaceOf(alice.get(), kind));

  Face const own = createConfigFace(alice.get(), kind);
  EXPECT_EQ(configFaceOf(alice.get(), kind), own);
  EXPECT_EQ(faceOf(view.get(), kind), own);
  EXPECT_TRUE(GetParam().isOfItsClass(view.get(), kind));

  alice->removeConfigFace(kind);
  EXPECT_FALSE(configFaceOf(alice.get(), kind));
  EXPECT_TRUE(faceOf(view.get(), kind));
  base->removeConfigFace(kind);
  EXPECT_FALSE(faceOf(view.get(), kind));
}

TEST_P(IdentityFaceTest, ADynamicFaceGivesWayToAConfiguredOneButNeverTheOtherWayRound) {
  Kind const kind = GetParam().kind;
  RefPtr<LS_IIdentityConfig> const alice = identity("alice");
  RefPtr<LS_IIdentity> const view = runtime(alice);

  Face const dynamic = createDynamicFace(view.get(), kind);
  EXPECT_TRUE(dynamic && createDynamicFace(view.get(), kind) == dynamic);
  EXPECT_FALSE(configFaceOf(alice.get(), kind));
  view->removeDynamicFace(kind);
  EXPECT_FALSE(faceOf(view.get(), kind));

  createDynamicFace(view.get(), kind);
  Face const configured = createConfigFace(alice.get(), kind);
  EXPECT_EQ(configFaceOf(alice.get(), kind), configured);
  EXPECT_EQ(createDynamicFace(view.get(), kind), configured);
  view->removeDynamicFace(kind);
  EXPECT_EQ(configFaceOf(alice.get(), kind), configured);
}

INSTANTIATE_TEST_SUITE_P(
    Faces,
    IdentityFaceTest,
    ::testing::Values(
        FaceKind{"AuthenticationOutbound", LS_IdentityFace::AUTHENTICATION_OUTBOUND,
                 &answers<LS_IAuthentication>},
        FaceKind{"AuthenticationInbound", LS_IdentityFace::AUTHENTICATION_INBOUND,
                 &answers<LS_IAuthentication>},
        FaceKind{"RegistrationOutbound", LS_IdentityFace::REGISTRATION_OUTBOUND,
                 &answers<LS_IRegistrationOutbound>},
        FaceKind{"RegistrationInbound", LS_IdentityFace::REGISTRATION_INBOUND,
                 &answers<LS_IRegistrationInbound>},
        FaceKind{"MessageSubscription", LS_IdentityFace::MESSAGE_SUBSCRIPTION, &answers<LS_IMwiSubscription>},
        FaceKind{"CallOutbound", LS_IdentityFace::CALL_OUTBOUND, &answers<LS_ICall, LS_IOutbound>},
        FaceKind{"CallInbound", LS_IdentityFace::CALL_INBOUND, &answers<LS_ICall, LS_IInbound>}),
    rowName<FaceKind>);

// A value outside the seven names no face: creating fails, storing null,
// and adds nothing.
TEST(IdentityFaces, AKindOutsideTheSevenFailsCleanly) {
  RefPtr<LS_CIdentity> const identity = adoptRef(new LS_CIdentity);
  Kind const invalid = static_cast<Kind>(7);
  int sentinel = 0;
  void* configured = &sentinel;
  void* dynamic = &sentinel;
  EXPECT_TRUE(identity->createConfigFaceIf(invalid, IID_Unknown(), &configured).isFailure());
  EXPECT_TRUE(identity->createDynamicFaceIf(invalid, IID_Unknown(), &dynamic).isFailure());
  EXPECT_TRUE(configured == nullptr && dynamic == nullptr);
  Vector<String> children;
  identity->getElements(LS_Strategy::LOCAL_OR_BASE, children);
  EXPECT_TRUE(children.isEmpty());
  EXPECT_EQ(LS_CIdentity::GET_ELEMENT_CID(invalid), CID_Unknown());
  EXPECT_EQ(LS_CIdentity::GET_ELEMENT_NAME(invalid), "");
}

TEST_F(LocationTest, FaceValuesComeDownATwoLevelChainAndEachChangeReachesTheDerivedIdentityOnce) {
  auto const top = createConfigFace<LS_IRegistrationOutboundConfig>(group("top").get(),
                                                                    LS_IdentityFace::REGISTRATION_OUTBOUND);
  RefPtr<LS_IIdentityConfig> const middle = group("middle", "top");
  RefPtr<LS_IIdentity> const alice = runtime(identity("alice", "middle"));
  createConfigFace<LS_IRegistrationOutboundConfig>(middle.get(), LS_IdentityFace::REGISTRATION_OUTBOUND)
      ->setConfigRetryTimeoutOnSystemError(20);
  top->setConfigLifetime(300);
  RefPtr<LS_IRegistrationOutbound> face;
  ASSERT_TRUE(LS_getFaceIf(alice.get(), LS_IdentityFace::REGISTRATION_OUTBOUND, face).isSuccess());
  EXPECT_EQ(face->getLifetime(), 300u);
  EXPECT_EQ(face->getRetryTimeoutOnSystemError(), 20u);

  FaceRecorder recorder(journal, "rec");
  recorder.watch(alice.get());
  top->setConfigLifetime(600);

  EXPECT_EQ(journal, Journal{"rec:outbound:alice:face"});
  EXPECT_EQ(recorder.lastIdentity, alice.get());
  EXPECT_EQ(recorder.lastFace, face.get());
  EXPECT_EQ(face->getLifetime(), 600u);
}

// The last edit, removing the own face of an identity without base, is one
// change with a null face.
TEST_F(LocationTest, RegisteredAndUnregisteredNeedTheFaceWhileChangesGoOutWithANullOne) {
  RefPtr<LS_IIdentityConfig> const alice = identity("alice");
  RefPtr<LS_IIdentity> const view = runtime(alice);
  FaceRecorder recorder(journal, "rec");
  recorder.watch(view.get());

  view->isInboundRegistered();
  view->isInboundUnregistered();
  static_cast<LS_CIdentity*>(alice.get())->notifyRegistrationInboundChange();

  createConfigFace(alice.get(), LS_IdentityFace::REGISTRATION_INBOUND);
  LogCapture log;
  view->isInboundRegistered();
  view->isInboundUnregistered();
  alice->removeConfigFace(LS_IdentityFace::REGISTRATION_INBOUND);
  EXPECT_EQ(journal, (Journal{"rec:inbound:alice:null", "rec:inbound:alice:face", "rec:registered:alice:face",
                              "rec:unregistered:alice:face", "rec:inbound:alice:null"}));
  EXPECT_TRUE(
      log.contains(formatted("LS_CIdentity(%p)::notifyRegistrationUnregistered()\n", logAddressOf(alice))));
}

// Removes "alice" from its location service, whose table held the last
// reference besides the event's.
class RemovingObserver : public LS_IRegistrationInboundObserver {
 public:
  explicit RemovingObserver(LS_ILocationServiceConfig* service) : m_service(service) {}
  void onRegistrationInboundChange(ObserverEvent<LS_IRegistrationInbound>&) override {}
  void onRegistrationInboundRegistered(ObserverEvent<LS_IRegistrationInbound>&) override {
    m_service->removeConfigIdentity("alice");
  }
  void onRegistrationInboundUnregistered(ObserverEvent<LS_IRegistrationInbound>&) override {}

 private:
  LS_ILocationServiceConfig* m_service;
};

TEST_F(LocationTest, AnObserverMayTakeAwayTheLastReferenceToTheIdentityThatTellsIt) {
  RemovingObserver observer(service.get());
  LS_IIdentity* alice = nullptr;
  void const* address = nullptr;
  {
    RefPtr<LS_IIdentityConfig> const config = identity("alice");
    createConfigFace(config.get(), LS_IdentityFace::REGISTRATION_INBOUND);
    static_cast<LS_CIdentity*>(config.get())->addRegistrationInboundObserver(&observer, 0);
    alice = runtime(config).get();
    address = logAddressOf(config);
  }
  LogCapture log;

  alice->isInboundRegistered();

  EXPECT_TRUE(log.contains(formatted("LS_CIdentity(%p)::~LS_Identity()\n", address)));
}

}  // namespace
