// ConfigCommands: the commands of the configuration layer, one for each
// operation of the configuration interfaces: location services and their
// domains, identities with their values, aliases and faces, every setting
// and list of each face, and authentication services with their realms and
// credentials. Run-time actions and questions belong to StackCommands.
#pragma once

class CommandTable;

void addConfigCommands(CommandTable& table);
