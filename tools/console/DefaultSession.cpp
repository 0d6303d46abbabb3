#include "DefaultSession.h"

char const* defaultSession() {
  return R"script(# A small gateway: the subscribers of example.com and of its branch office,
# and a trunk to a carrier that sends calls for any number.

location-service example.com create
location-service example.com imperative set authoritative
location-service example.com domain insert 0 example.com
location-service example.com domain insert 1 branch.example.com
location-service carrier create
location-service carrier domain insert 0 sip.carrier.net

authentication-service subscribers create
authentication-service subscribers protocol set http
authentication-service subscribers realm insert 0 example.com
authentication-service subscribers credentials set DEFAULT welcome
authentication-service subscribers credentials set alice alice-secret
authentication-service carrier-account create
authentication-service carrier-account realm insert 0 sip.carrier.net
authentication-service carrier-account credentials set gateway42 trunk-secret

# What every subscriber inherits, unless it says otherwise.
identity example.com DEFAULT create identity-group
identity example.com DEFAULT face registration-inbound create
face example.com DEFAULT registration-inbound lifetime-range set 60 3600 600
identity example.com DEFAULT face authentication-inbound create
face example.com DEFAULT authentication-inbound authenticate insert 0 subscribers
identity example.com DEFAULT face call-inbound create
face example.com DEFAULT call-inbound voip-profile set office

identity example.com alice create identity DEFAULT
identity example.com alice display-name set "Alice Liddell"
identity example.com alice alias-name add 201
identity example.com bob create identity DEFAULT
identity example.com bob alias-name add 202
identity example.com sales create identity DEFAULT
identity example.com sales alias-range add 300 399
identity example.com operator create identity DEFAULT
identity example.com operator alias-expression add "^[09]$"

# The trunk registers with the carrier and answers its challenges.
identity carrier trunk create identity
identity carrier trunk alias-expression add "^\+?[0-9]+$"
identity carrier trunk face registration-outbound create
face carrier trunk registration-outbound registrar set sip.carrier.net
face carrier trunk registration-outbound lifetime set 600
face carrier trunk registration-outbound proxy insert 0 proxy.carrier.net:5060 loose
identity carrier trunk face authentication-outbound create
face carrier trunk authentication-outbound authenticate insert 0 carrier-account gateway42

stack local-host-ports 192.0.2.10:5060

echo == The model
dump

echo == Requests
resolve sip:alice@example.com
resolve sip:202@example.com
explain sip:350@example.com
explain sip:9@branch.example.com:5060
explain sip:carol@example.com
explain sip:+493012345@sip.carrier.net
explain sip:alice@192.0.2.10
explain sip:nobody@unknown.org

echo == Authentication
challenge sip:alice@example.com
response sip:alice@example.com http example.com alice
response sip:carol@example.com http example.com carol
credentials sip:+493012345@sip.carrier.net http sip.carrier.net

echo == A change on the group reaches every subscriber
watch on
register example.com alice <sip:alice@192.0.2.33:5062> call-1@192.0.2.33 3600
face example.com DEFAULT registration-inbound lifetime-range set 60 7200 600
watch off
dump identity example.com bob
)script";
}
