// StackCommands: what the SIP stack does with the library, issued by hand.
// Its settings for every question ("stack ..."), its run-time actions on an
// identity's faces (contacts registered and removed, proxy, registrar and
// message server learnt and forgotten, dynamic identities), and its
// questions: the location service for a host, the identity of a name-addr,
// the realms to challenge with, the passwords to check, the credentials to
// answer with, and an explanation of one identity resolution.
#pragma once

class CommandTable;

void addStackCommands(CommandTable& table);
