#include "LS_CRegistrationInbound.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <thread>
#include <vector>

#include "DumpRows.h"
#include "LS_AddressText.h"
#include "SipStatistics.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

CNameAddr nameAddr(char const* text) {
  CNameAddr parsed;
  EXPECT_TRUE(parsed.Parse(text, std::strlen(text))) << text;
  return parsed;
}

CHostPort const RECEIVED("198.51.100.7", 5062);

XCode registerContact(LS_CRegistrationInbound& face, char const* uri, char const* callId = "call-1") {
  return face.addContact(callId, nameAddr(uri), RECEIVED, "context", "provider", 1, 3600);
}

using Listing = std::vector<std::string>;

// Every contact the face knows, static then dynamic, as "uri callId expires";
// the first index past them fails.
Listing contacts(LS_CRegistrationInbound const& face) {
  Listing listed;
  String callId = "stale";
  CNameAddr contact;
  CHostPort received;
  String text;
  unsigned int priority = 0;
  unsigned int expires = 99;
  unsigned int const count = face.getNumberOfContacts();
  for (unsigned int index = 0; index < count; ++index) {
    EXPECT_TRUE(face.getContact(index, callId, contact, received, text, text, priority, expires).isSuccess());
    listed.push_back(LS_nameAddrToString(contact).str() + " " + callId.str() + " " + std::to_string(expires));
  }
  EXPECT_TRUE(face.getContact(count, callId, contact, received, text, text, priority, expires).isFailure());
  return listed;
}

// The global count and the statistics against their values when the test
// began: other tests may leave faces alive.
class GlobalCountWatch {
 public:
  int contacts() const { return LS_CRegistrationInbound::getGlobalContacts() - m_contactsAtStart; }
  int statistics() const { return s_sipStatistics.getInboundRegistrations() - m_statisticsAtStart; }

 private:
  int const m_contactsAtStart = LS_CRegistrationInbound::getGlobalContacts();
  int const m_statisticsAtStart = s_sipStatistics.getInboundRegistrations();
};

// A face whose base is the same face of the base identity.
class RegistrationInboundTest : public ::testing::Test {
 protected:
  void SetUp() override { face->setBase(base.get()); }

  GlobalCountWatch count;
  RefPtr<LS_CRegistrationInbound> base = adoptRef(new LS_CRegistrationInbound);
  RefPtr<LS_CRegistrationInbound> face = adoptRef(new LS_CRegistrationInbound);
};

TEST_F(RegistrationInboundTest, LifetimeRangeIsInheritedKeptInAnyOrderAndDefaultedOnAFailedRead) {
  using Range = std::vector<unsigned int>;
  Range range(3);
  base->setConfigLifetimeRange(300, 100, 200);

  face->getLifetimeRange(range[0], range[1], range[2]);
  EXPECT_EQ(range, (Range{300, 100, 200}));
  EXPECT_TRUE(face->getConfigLifetimeRange(range[0], range[1], range[2]).isFailure());
  EXPECT_EQ(range, (Range{0, 4294967295u, 3600}));
}

TEST_F(RegistrationInboundTest, ReRegistrationOverwritesTheEntryAndCountsTheContactOnce) {
  face->addContact("call-1", nameAddr("sip:alice@example.com"), RECEIVED, "", "", 1, 60);
  face->addContact("call-2", nameAddr("\"Alice\" <sip:alice@example.com>"), RECEIVED, "", "", 2, 120);

  EXPECT_EQ(contacts(*face), Listing{"\"Alice\" <sip:alice@example.com> call-2 120"});
  EXPECT_EQ(count.contacts(), 1);
  EXPECT_EQ(count.statistics(), 1);
}

TEST_F(RegistrationInboundTest, RemoveContactMatchesAnyCallIdWhenEmptyElseExactlyTheSameText) {
  struct Removal {
    char const* callId;
    bool removes;
  };
  for (Removal const& removal : {Removal{"", true}, Removal{"call-1", true}, Removal{"call-2", false},
                                 Removal{"call-", false}, Removal{"call-1 ", false}}) {
    SCOPED_TRACE(std::string("Call-ID \"") + removal.callId + "\"");
    registerContact(*face, "sip:alice@example.com", "call-1");

    face->removeContact(nameAddr("sip:alice@example.com"), removal.callId);

    EXPECT_EQ(face->getNumberOfContacts(), removal.removes ? 0u : 1u);
    EXPECT_EQ(count.contacts(), removal.removes ? 0 : 1);
    EXPECT_EQ(count.statistics(), count.contacts());
    face->removeContacts();
  }
}

TEST_F(RegistrationInboundTest, RemovingTheLastOwnContactShowsTheInheritedOnesWhichAreNotCountedAgain) {
  registerContact(*base, "sip:b1@example.com", "call-b1");
  registerContact(*base, "sip:b2@example.com", "call-b2");
  registerContact(*face, "sip:f1@example.com", "call-f1");
  EXPECT_EQ(contacts(*face), Listing{"<sip:f1@example.com> call-f1 3600"});

  face->removeContact(nameAddr("sip:f1@example.com"), "call-f1");

  EXPECT_EQ(contacts(*face),
            (Listing{"<sip:b1@example.com> call-b1 3600", "<sip:b2@example.com> call-b2 3600"}));
  EXPECT_EQ(count.contacts(), 2);
}

TEST_F(RegistrationInboundTest,
       ConfiguringARegisteredContactTakesItOverRefusesItsRegistrationAndListsItFirst) {
  registerContact(*face, "sip:alice@example.com");

  ASSERT_TRUE(face->addConfigContact(nameAddr("sip:alice@example.com"), "office", "carrier", 5).isSuccess());
  EXPECT_EQ(count.contacts(), 0);
  EXPECT_EQ(count.statistics(), 0);
  EXPECT_EQ(contacts(*face), Listing{"<sip:alice@example.com>  0"});
  EXPECT_FALSE(face->containsElement("dynamic-contact", LS_Strategy::LOCAL_ONLY));
  {
    Journal journal;
    ContainerWatch watch(face.get(), journal, "face");
    EXPECT_TRUE(registerContact(*face, "sip:alice@example.com").isFailure());
    EXPECT_TRUE(journal.empty());
    EXPECT_EQ(count.contacts(), 0);
  }

  for (char const* uri : {"sip:d1@example.com", "sip:d2@example.com"})
    registerContact(*face, uri, "call-d");
  face->addConfigContact(nameAddr("sip:s2@example.com"), "", "", 6);
  EXPECT_EQ(contacts(*face),
            (Listing{"<sip:alice@example.com>  0", "<sip:s2@example.com>  0",
                     "<sip:d1@example.com> call-d 3600", "<sip:d2@example.com> call-d 3600"}));
}

// A way for a face's own dynamic contacts to go all at once.
using FacePtr = RefPtr<LS_CRegistrationInbound>;
struct WayOut {
  char const* name;
  void (*leave)(FacePtr& face);
};

class ContactsWayOutTest : public RegistrationInboundTest, public ::testing::WithParamInterface<WayOut> {};

TEST_P(ContactsWayOutTest, GivesEveryOwnContactBackToTheCountAndTheStatistics) {
  registerContact(*base, "sip:inherited@example.com");
  for (char const* uri : {"sip:a@example.com", "sip:b@example.com", "sip:c@example.com", "sip:d@example.com"})
    registerContact(*face, uri);
  ASSERT_EQ(count.contacts(), 5);

  GetParam().leave(face);

  EXPECT_EQ(count.contacts(), 1);
  EXPECT_EQ(count.statistics(), 1);
}

INSTANTIATE_TEST_SUITE_P(
    RegistrationInbound,
    ContactsWayOutTest,
    ::testing::Values(WayOut{"RemoveContacts", [](FacePtr& f) { f->removeContacts(); }},
                      WayOut{"RemoveElement", [](FacePtr& f) { f->removeElement("dynamic-contact"); }},
                      WayOut{"ResetIntoAShadow", [](FacePtr& f) { f->reset(); }},
                      WayOut{"DestroyedFace", [](FacePtr& f) { f = nullptr; }}),
    [](::testing::TestParamInfo<WayOut> const& info) { return std::string(info.param.name); });

TEST(RegistrationInboundGlobalCount, StaysExactWhileFacesOnSeveralThreadsAddAndRemoveContacts) {
  GlobalCountWatch count;
  std::vector<RefPtr<LS_CRegistrationInbound>> faces;
  std::vector<std::thread> threads;
  for (int thread = 0; thread < 4; ++thread) {
    faces.push_back(adoptRef(new LS_CRegistrationInbound));
    threads.emplace_back([thread, face = faces.back().get()] {
      std::vector<CNameAddr> uris;
      for (int index = 0; index < 4; ++index)
        uris.push_back(nameAddr(String().format("sip:t%d-%d@example.com", thread, index).c_str()));
      for (int round = 0; round < 2000; ++round) {
        for (CNameAddr const& uri : uris)
          face->addContact("call", uri, RECEIVED, "", "", 0, 60);
        face->addContact("again", uris[0], RECEIVED, "", "", 0, 60);
        face->removeContact(uris[1], "");
        face->addConfigContact(uris[2], "", "", 0);
        face->removeConfigContact(uris[2]);
        face->removeContacts();
        RefPtr<LS_CRegistrationInbound> shortLived = adoptRef(new LS_CRegistrationInbound);
        shortLived->addContact("call", uris[3], RECEIVED, "", "", 0, 60);
      }
      face->addContact("call", uris[0], RECEIVED, "", "", 0, 60);
    });
  }
  for (std::thread& thread : threads)
    thread.join();

  EXPECT_EQ(count.contacts(), 4);
  EXPECT_EQ(count.statistics(), 4);
  faces.clear();
  EXPECT_EQ(count.contacts(), 0);
  EXPECT_EQ(count.statistics(), 0);
}

TEST_F(RegistrationInboundTest, DumpShowsOwnStaticContactsAndTheDynamicContactsInEffect) {
  IpAddress denied;
  ASSERT_TRUE(denied.set("10.0.0.0", "255.0.0.0"));
  base->insertConfigFilterRule(0, LS_FilterType::DENY, denied);
  base->addConfigContact(nameAddr("sip:base-static@example.com"), "hidden", "hidden", 9);
  base->addContact("call-d1", nameAddr("sip:d1@example.com"), RECEIVED, "ctx-d1", "prov-d1", 3, 3600);
  face->addConfigContact(nameAddr("sip:s1@example.com"), "office", "carrier-a", 1);
  InfoContainer info;

  face->getInfo(info, 10, 1, 3, 2, "> ");

  EXPECT_EQ(dumpRows(info), (DumpRows{
                                "1|> Inbound Registration|",
                                "2|Filter|",
                                "3|deny 10.0.0.0 255.0.0.0|",
                                "2|Lifetime Range|[0s..4294967295s] (Default: 3600s)",
                                "2|Static Configured Contacts|",
                                "3|contact|<sip:s1@example.com>",
                                "4|context|office",
                                "4|provider|carrier-a",
                                "4|priority|1",
                                "2|Dynamic Registered Contacts|",
                                "3|contact|<sip:d1@example.com>",
                                "4|received|198.51.100.7:5062",
                                "4|context|ctx-d1",
                                "4|provider|prov-d1",
                                "4|priority|3",
                                "4|expires|3600",
                                "4|callId|call-d1",
                            }));
}

TEST(RegistrationInboundLog, LifetimeAndRangeChangesAreLoggedAndContactChangesAreNot) {
  LogCapture log;
  RefPtr<LS_CRegistrationInbound> face = adoptRef(new LS_CRegistrationInbound);
  void const* const self = static_cast<LS_IElement*>(face.get());

  face->setConfigLifetimeRange(60, 7200, 3600);
  face->removeConfigLifetimeRange();
  registerContact(*face, "sip:alice@example.com");
  face->addConfigContact(nameAddr("sip:bob@example.com"), "", "", 0);
  face->removeContacts();
  face = nullptr;

  Listing ownLines;
  for (std::string const& line : log.lines()) {
    if (line.rfind("LS_CRegistrationInbound(", 0) == 0)
      ownLines.push_back(line);
  }
  EXPECT_EQ(ownLines,
            (Listing{formatted("LS_CRegistrationInbound(%p)::LS_CRegistrationInbound()\n", self),
                     formatted("LS_CRegistrationInbound(%p)::setConfigLifetimeRange(60,7200,3600)\n", self),
                     formatted("LS_CRegistrationInbound(%p)::removeConfigLifetimeRange()\n", self),
                     formatted("LS_CRegistrationInbound(%p)::~LS_CRegistrationInbound()\n", self)}));
}

}  // namespace
