#pragma once

#include "generation/due_rules.h"

#include <QDate>

namespace quotas {

class Connection;
class DuesCounter;
class Recordset;
struct GenerationOutcome;

// What the generation run hands the posting of one due: the month, the
// member it is visiting and the sets it keeps open.
struct PostingContext {
    Connection& connection;
    int ano = 0;
    int mes = 0;
    QDate today;
    Recordset& member;     // current row: no, no_tap, empresa, seguro, seguro_data_rescisao
    Recordset& account;    // the member's account row, locked for this transaction
    Recordset& employers;  // tbEmpresas, searched by code
    Recordset& movements;  // reopened here for every due
    DuesCounter& counter;
    GenerationOutcome& outcome;
};

// Posts the due of one type for the current member unless he is already
// charged with it for the month: the movement row with its number and
// amount, and the account's total, last amount, year and month. Must run
// inside the member's transaction. The account's changes are left pending
// in ctx.account, so the caller saves both dues' changes in one statement.
// A due whose remunerations or employer rate are empty is not posted and
// is counted in ctx.outcome. Returns whether a movement was written.
bool LancarQuota(PostingContext& ctx, DueType type);

// The label of the current member in messages: his staff number, or his
// key when he has none.
QString memberLabel(const Recordset& member);

}  // namespace quotas
