#pragma once

#include "generation/due_rules.h"

#include <QDate>
#include <QList>

namespace quotas {

class Connection;
class DuesAccount;
class DuesCounter;
class Recordset;
struct GenerationOutcome;

// What the generation run hands the posting of one due: the month, the
// member it is visiting, his locked account and the sets it keeps open.
struct PostingContext {
    Connection& connection;
    int ano = 0;
    int mes = 0;
    QDate today;
    const Recordset& member;  // current row: no, no_tap, empresa, seguro, seguro_data_rescisao
    DuesAccount& account;     // the member's account, locked for this transaction
    Recordset& employers;     // tbEmpresas, searched by code
    DuesCounter& counter;
    GenerationOutcome& outcome;
    // The types the member is already charged with for the month, read
    // under the account's lock (bit tipo set).
    unsigned charged = 0;
    // The dues decided for the member, in the order they are numbered.
    struct Due {
        DueType type;
        double rend1;
        double rend2;
        double amount;
    };
    QList<Due> dues;
};

// Decides the due of one type for the current member unless he is already
// charged with it for the month or, for the insurance, not insured then:
// its amount goes to ctx.dues, for WriteDues. A due whose remunerations or
// employer rate are empty is not posted and is counted in ctx.outcome.
// Returns whether a due was decided.
bool LancarQuota(PostingContext& ctx, DueType type);

// Writes the member's decided dues: their numbers in one change of the
// counter, the movement rows in one statement, and their charges on
// ctx.account (saved by the caller with the member's other writes). Must
// run inside the member's transaction.
void WriteDues(PostingContext& ctx);

// The current member in messages: his staff number, or his key when he has none.
QString memberLabel(const Recordset& member);

}  // namespace quotas
