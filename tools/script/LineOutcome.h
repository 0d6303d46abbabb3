// LineOutcome: what running one line of the script language printed (its
// events and debug lines included, even when it failed: they happened) and,
// when it could not be applied, why. The script runner shows it the same
// whether the line ran on a local session or on a gateway.
#pragma once

#include <optional>
#include <string>

#include "ScriptLine.h"

struct LineOutcome {
  std::string printed;
  std::optional<CommandError> failure;
};
