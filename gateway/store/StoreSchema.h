// StoreSchema: the tables and statements both stores use. The SQL is the
// same for SQLite and PostgreSQL except for the database's clock, written
// {now} here and filled in by each backend (milliseconds since the epoch):
// parameters are $1, $2, ... in order of first appearance, which SQLite
// reads as named parameters numbered the same way.
//
// Decisions, with their reasons:
// - The table location_gateway holds the schema's version; a store without
//   it is not ours (a file that happens to be an SQLite database of another
//   program), and one with a higher version was written by a newer gateway
//   whose rows this one cannot read: both are refused, never altered.
// - Expiry is an absolute time on the database's clock, written as "now
//   plus the remaining lifetime" and read as "expiry minus now": the
//   database's clock decides, so gateways sharing one need not agree on the
//   time, and the gateway's own clock never enters the store.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "store/StoredBinding.h"

namespace StoreSchema {

constexpr int kVersion = 1;

// The meta table's name: its presence marks a store of ours.
constexpr char kMetaTable[] = "location_gateway";

constexpr char kCreateMeta[] = "CREATE TABLE location_gateway (name TEXT PRIMARY KEY, value TEXT NOT NULL)";
constexpr char kInsertVersion[] = "INSERT INTO location_gateway (name, value) VALUES ('schema', $1)";
constexpr char kSelectVersion[] = "SELECT value FROM location_gateway WHERE name = 'schema'";
constexpr char kCreateBindings[] =
    "CREATE TABLE bindings ("
    "service TEXT NOT NULL, identity TEXT NOT NULL, uri TEXT NOT NULL, contact TEXT NOT NULL, "
    "call_id TEXT NOT NULL, cseq BIGINT NOT NULL, source TEXT NOT NULL, transport TEXT NOT NULL, "
    "expires BIGINT NOT NULL, dynamic INTEGER NOT NULL, "
    "PRIMARY KEY (service, identity, uri))";

// $1..$8 the binding's text and CSeq, $9 its remaining milliseconds, $10
// whether its identity is dynamic (0 or 1).
constexpr char kUpsert[] =
    "INSERT INTO bindings (service, identity, uri, contact, call_id, cseq, source, transport, expires, "
    "dynamic) VALUES ($1, $2, $3, $4, $5, $6, $7, $8, {now} + $9, $10) "
    "ON CONFLICT (service, identity, uri) DO UPDATE SET contact = excluded.contact, "
    "call_id = excluded.call_id, cseq = excluded.cseq, source = excluded.source, "
    "transport = excluded.transport, expires = excluded.expires, dynamic = excluded.dynamic";
constexpr char kDelete[] = "DELETE FROM bindings WHERE service = $1 AND identity = $2 AND uri = $3";
// A binding that ran out on a gateway's clock: deleted unless the row lives
// on for more than the 2 s the clocks may differ by (another gateway
// refreshed it).
constexpr char kDeleteIfExpired[] =
    "DELETE FROM bindings WHERE service = $1 AND identity = $2 AND uri = $3 AND expires <= {now} + 2000";
constexpr char kDeleteExpired[] = "DELETE FROM bindings WHERE expires <= {now}";
// Columns in StoredBinding's order; the ninth is the remaining milliseconds.
constexpr char kSelectLive[] =
    "SELECT service, identity, uri, contact, call_id, cseq, source, transport, expires - {now}, dynamic "
    "FROM bindings WHERE expires > {now}";
constexpr char kSelectIdentity[] =
    "SELECT service, identity, uri, contact, call_id, cseq, source, transport, expires - {now}, dynamic "
    "FROM bindings WHERE expires > {now} AND service = $1 AND identity = $2";

// text with every {now} replaced by the backend's clock expression.
std::string withClock(char const* text, char const* now);

// kUpsert's parameters for binding at nowMs on MonotonicClock; a binding
// already expired is written expired (zero remaining).
std::vector<std::string> upsertParameters(StoredBinding const& binding, uint64_t nowMs);
// A row of kSelectLive or kSelectIdentity, columns as text; false when a
// number does not read as one.
bool fromRow(char const* const* columns, uint64_t nowMs, StoredBinding& binding);

}  // namespace StoreSchema
