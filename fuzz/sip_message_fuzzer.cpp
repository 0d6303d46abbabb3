// Feeds arbitrary bytes through the gateway's request path as the stack
// would hand them over: libre's message decoder, then the front-end's
// routing (SipFrontEnd::route) to Admission, then through a method table
// filled as the gateway fills it to the Registrar with its digest
// authentication, message waiting or the Redirector, against the gateway
// tests' model (GatewayHarness::loadModel) and a stack without transports.
//
// The input is a stream of messages framed as on a TCP connection: each
// one's body is as long as its Content-Length says (the rest of the input
// when it has none), and line breaks between them are skipped. At most
// kMaximumMessages an input, so that a REGISTER can be followed by its
// refresh, its retransmission or a call to the user it bound. Each request
// arrives over the transport its Via names (UDP when none), from the
// address its Via names (kDefaultSource when that is not an address): a
// phone behind NAT is one whose Contact is elsewhere. ACKs and responses
// never reach the routing, as in the front-end, and are skipped. After the
// messages, time passes in steps until every binding has run out, so that
// the expiry sweep and the NAT pings run too.
//
// Every input starts from the same state: a fresh model, registrar and
// clock (GatewayHarness), so that a failing input fails alone. Besides
// not crashing, leaking or tripping the sanitizers, the gateway must keep
// these, each checked with abort():
// - every request routed is answered exactly once, and the answer decodes
//   as a response to it (same Call-ID and CSeq number);
// - no binding outlives the longest lifetime a face allows;
// - destroying the registrar brings the global count of registered
//   contacts back to where it was before the input.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "GatewayHarness.h"
#include "SipStatistics.h"
#include "mwi/MessageWaiting.h"
#include "redirect/Redirector.h"
#include "registrar/ExpiryRange.h"
#include "registrar/NonceGenerator.h"
#include "registrar/Registrar.h"
#include "sip/Admission.h"
#include "sip/Exchange.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/Listeners.h"
#include "sip/MethodTable.h"
#include "sip/RequestLog.h"
#include "sip/SipFrontEnd.h"

namespace {

constexpr unsigned int kMaximumMessages = 8;
constexpr uint32_t kNatPingSeconds = 30;
// Time passes in kTimeSteps of kTimeStepMs, past the longest lifetime a
// binding can get: the gateway's maximum, which no face of the model
// exceeds.
constexpr uint64_t kTimeStepMs = 800 * 1000;
constexpr unsigned int kTimeSteps = 5;
static_assert(kTimeSteps * kTimeStepMs > uint64_t{ExpiryRange::kMaximum} * 1000,
              "bindings outlive the steps");
constexpr char kDefaultSource[] = "192.0.2.1";
constexpr char kGatewayAddress[] = "127.0.0.1";
constexpr uint16_t kSipPort = 5060;

void check(bool condition, char const* what) {
  if (condition)
    return;
  std::fprintf(stderr, "sip_message_fuzzer: %s\n", what);
  std::abort();
}

// The stack the answers go through: no transports, no DNS client, so it
// sends nothing; kept for the process.
sip& stack() {
  static sip* const stack = [] {
    sip* made = nullptr;
    check(sip_alloc(&made, nullptr, 16, 16, 16, "location-gateway", nullptr, nullptr) == 0,
          "the stack cannot be made");
    return made;
  }();
  return *stack;
}

// The seeds' Authorization headers carry nonces that fuzz/sip_message_seeds.py
// computed as the gateway makes them under the harness's key and clock;
// this one is the script's for the realm, Call-ID and source below. A gateway that
// makes them otherwise would refuse every seeded digest, and the fuzzing
// would never reach an authenticated REGISTER: the script must be run
// again.
void checkSeededNonces() {
  static bool const done = [] {
    pl realm;
    pl callId;
    pl_set_str(&realm, "example.com");
    pl_set_str(&callId, "fuzz-self-check");
    check(NonceGenerator().make(realm, callId, "udp 127.0.0.1", GatewayHarness::kStartMs) ==
              "0000019ab697e8000000000000000000000000000000000110197af2495b4b89eb1adca6d9b1ae401fee3c72",
          "the gateway makes other nonces than the seeds carry: run fuzz/sip_message_seeds.py");
    return true;
  }();
  (void)done;
}

// What the transport would have filled in; see the file comment.
void arrive(sip_msg& message) {
  message.tp =
      message.via.tp == SIP_TRANSP_TCP || message.via.tp == SIP_TRANSP_TLS ? message.via.tp : SIP_TRANSP_UDP;
  if (sa_isset(&message.via.addr, SA_ADDR)) {
    message.src = message.via.addr;
    if (sa_port(&message.src) == 0)
      sa_set_port(&message.src, kSipPort);
  } else {
    sa_set_str(&message.src, kDefaultSource, kSipPort);
  }
  sa_set_str(&message.dst, kGatewayAddress, kSipPort);
  message.sock = nullptr;
}

// The answer sent for request, which must be the only message sent.
void checkAnswer(sip_msg const& request) {
  std::vector<std::string> const sent = GatewayHarness::takeSent();
  check(sent.size() == 1, "a request was not answered exactly once");
  mbuf* const buffer = mbuf_alloc(sent[0].size());
  check(
      buffer && mbuf_write_mem(buffer, reinterpret_cast<uint8_t const*>(sent[0].data()), sent[0].size()) == 0,
      "out of memory");
  buffer->pos = 0;
  sip_msg* answer = nullptr;
  check(sip_msg_decode(&answer, buffer) == 0, "an answer does not decode");
  check(!answer->req && answer->scode >= 100 && answer->scode < 700, "an answer is not a response");
  check(pl_cmp(&answer->callid, &request.callid) == 0, "an answer has another Call-ID");
  check(answer->cseq.num == request.cseq.num, "an answer has another CSeq");
  // For whoever writes seeds: what each request was answered.
  static bool const show = std::getenv("SIP_MESSAGE_FUZZER_SHOW") != nullptr;
  if (show)
    std::fprintf(stderr, "%.*s %.*s -> %u %.*s\n", static_cast<int>(request.met.l), request.met.p,
                 static_cast<int>(request.ruri.l), request.ruri.p, answer->scode,
                 static_cast<int>(answer->reason.l), answer->reason.p);
  mem_deref(answer);
  mem_deref(buffer);
}

void route(sip_msg& message,
           ScriptSession& session,
           RequestLog& log,
           LibraryClock& clock,
           Admission const& admission,
           MethodTable const& methods) {
  arrive(message);
  Exchange exchange(stack(), message, session, log, clock);
  SipFrontEnd::route(exchange, admission, methods);
  check(exchange.answered(), "a request was left unanswered");
  checkAnswer(message);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
  GatewayHarness::startInput();
  checkSeededNonces();
  ScriptSession session;
  GatewayHarness::loadModel(session);
  LibraryClock clock(false);
  RequestLog log;
  Listeners const listeners;
  Redirector redirector;
  Admission const admission(listeners, redirector.sources());
  int const registeredBefore = s_sipStatistics.getInboundRegistrations();
  {
    Registrar registrar(clock);
    registrar.start(stack(), ExpiryRange(), kNatPingSeconds);
    MethodTable methods;
    methods.add("REGISTER", registrar);
    // Out-of-dialog NOTIFYs, as unasked message-waiting ones arrive; the
    // model has no message-waiting face, so each is refused, after its
    // Event and its identity were read.
    MessageWaiting messageWaiting(session, clock, registrar);
    registrar.addListener(&messageWaiting);
    methods.add("NOTIFY", messageWaiting);
    for (char const* method : {"INVITE", "MESSAGE", "SUBSCRIBE", "OPTIONS"})
      methods.add(method, redirector);
    mbuf* const input = mbuf_alloc(size + 1);
    check(input && mbuf_write_mem(input, data, size) == 0, "out of memory");
    input->pos = 0;
    for (unsigned int count = 0; count < kMaximumMessages; ++count) {
      // Line breaks between messages are keep-alives, as on a connection.
      while (mbuf_get_left(input) >= 2 && std::memcmp(mbuf_buf(input), "\r\n", 2) == 0)
        input->pos += 2;
      if (mbuf_get_left(input) == 0)
        break;
      sip_msg* message = nullptr;
      if (sip_msg_decode(&message, input) != 0)
        break;
      size_t const left = mbuf_get_left(input);
      size_t const body = pl_isset(&message->clen) ? std::min<size_t>(pl_u32(&message->clen), left) : left;
      if (message->req && pl_strcmp(&message->met, "ACK") != 0)
        route(*message, session, log, clock, admission, methods);
      mem_deref(message);
      input->pos += body;
    }
    mem_deref(input);
    for (unsigned int step = 0; step < kTimeSteps; ++step) {
      GatewayHarness::setNow(GatewayHarness::now() + kTimeStepMs);
      GatewayHarness::runTimers();
    }
    GatewayHarness::takeSent();
    check(registrar.bindingCount() == 0, "a binding outlived its lifetime");
  }
  check(s_sipStatistics.getInboundRegistrations() == registeredBefore,
        "registered contacts were left behind by the registrar");
  return 0;
}
