#include "LS_ProtocolConfig.h"

#include "LS_EnumerationText.h"

char const* LS_ProtocolConfig::NAME(Type value) {
  static char const* const kTexts[] = {"preferred-none",
                                       "preferred-udp-tcp-tls",
                                       "preferred-udp-tls-tcp",
                                       "preferred-tcp-udp-tls",
                                       "preferred-tcp-tls-udp",
                                       "preferred-tls-udp-tcp",
                                       "preferred-tls-tcp-udp",
                                       "forced-tls",
                                       "forced-tcp",
                                       "forced-udp"};
  return LS_enumerationText(kTexts, value);
}
