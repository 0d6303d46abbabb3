// InboundFilter: whether an identity's inbound face (inbound registration or
// inbound call) lets in a request from a source, by the face's filter rules
// (its own list, else the one its base identity's face holds), and the 403 a
// part answers when it does not. Which face judges a request is the caller's
// to say: the registrar asks the registering identity's inbound-registration
// face, the redirect server the called identity's inbound call face.
//
// Decisions, with their reasons:
// - The rules are read in order and the first that matches the source
//   decides. A face without rules, or an identity without the face, lets
//   every source in.
// - When rules are there but none matches, the source is denied if the list
//   holds an accept rule and let in if it holds deny rules only: operators
//   of FreeSWITCH (an ACL whose default denies), Asterisk (deny 0.0.0.0/0
//   before the permits) and Kamailio (the permissions module's allow and
//   deny files) write a list naming whom it accepts to mean "only these",
//   and one naming only whom it denies to mean "anyone but these", and so
//   neither list needs a catch-all rule at its end to mean what it says.
// - A rule matches when (source & mask) == (address & mask), within its own
//   family: an IPv4 rule never matches an IPv6 source, nor an IPv6 rule an
//   IPv4 one. A source in mapped form (::ffff:a.b.c.d, from a dual-stack
//   socket) is the IPv4 address it carries, as SourceFilter has it, so that
//   the form of an address lets nobody past a rule. The empty address
//   matches every source.
// - IpAddress shows its value as text only, so each rule is read back from
//   its text for each request (well under a microsecond a rule), which only
//   requests for identities with rules pay: the rules change at any time
//   over the control socket, and a copy kept here would have to follow them.
// - What the request log says of a denied request, after the identity in
//   its result column: `denied by rule 1 "deny 10.0.0.0 255.0.0.0"`, or
//   `denied, no rule of 2 matches`. The position is the index the console's
//   filter-rule commands take (from 0), so that the line names the rule an
//   operator would modify or remove; the text is the rule as the identity's
//   dump prints it. The identity stays the column's first word, so that
//   whatever reads the identities off the log still finds them.
//
// Stateless; called on libre's thread like the parts that use it.
#pragma once

#include <string>

#include "IpAddress.h"
#include "LS_FilterType.h"
#include "LS_IIdentity.h"
#include "LS_IInbound.h"
#include "LS_IdentityFace.h"
#include "sip/Libre.h"

class Exchange;

class InboundFilter {
 public:
  static constexpr unsigned int kNoRule = ~0u;

  // What a face's rules make of a source.
  struct Verdict {
    bool accepted = true;
    // The rule that decided, its type and address; kNoRule when none did.
    unsigned int rule = kNoRule;
    LS_FilterType::Type type = LS_FilterType::ACCEPT;
    IpAddress address;
    unsigned int rules = 0;  // in effect on the face
  };

  static Verdict judge(LS_IInbound const& face, sa const& source);
  // Whether a rule's address (and mask) matches source.
  static bool matches(IpAddress const& rule, sa const& source);
  // What the log says of a denied verdict (see above).
  static std::string reason(Verdict const& verdict);

  // When the identity's face of that kind denies the request's source:
  // answers 403 Forbidden, the log line naming the identity and the reason,
  // and returns true. Nothing is answered otherwise.
  static bool refuses(Exchange& exchange, LS_IIdentity const& identity, LS_IdentityFace::Type face);
};
