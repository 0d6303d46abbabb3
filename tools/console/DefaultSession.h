// DefaultSession: the script the console runs when it is given none: a
// small gateway's configuration (two location services, a "DEFAULT" group
// with registration, call and authentication settings, subscribers with
// alias names, a range and an expression, a trunk to a carrier, and the
// authentication services behind them), then a session over it: the model's
// dump, requests resolved and explained, a challenge, a response, the
// credentials for a carrier's challenge, and a group change reaching every
// subscriber. Printing it gives a starting point for one's own script.
#pragma once

char const* defaultSession();
