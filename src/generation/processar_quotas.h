#pragma once

#include "generation/generation_outcome.h"

#include <QDate>

namespace quotas {

class Connection;

// The monthly dues generation: for month mes of year ano, every member
// (socio 0) or the one member whose socio_id is socio gets a dues account
// when he has none, then the union due and, when insured, the insurance
// due, unless he is already charged with them for that month. Running the
// same month again posts only what is missing.
//
// Each member's writes (account, counter, movements) commit together in
// one transaction; a failure stops the run with a QuotasError that names
// the member, and what was committed before it stays. Two runs at once on
// one database never charge a due twice nor share a number.
//
// The progress display "Velumo.General" is created into shared().progress
// and advanced once per member; it is closed when the run ends, also after
// a failure. The outcome tells which dues could not be computed.
GenerationOutcome ProcessarQuotas(Connection& connection, int ano, int mes, int socio,
                                  QDate today = QDate::currentDate());

// The same on the shared connection SqlServer.
GenerationOutcome ProcessarQuotas(int ano, int mes, int socio);

}  // namespace quotas
