#pragma once

#include "import/import_verdict.h"

#include <QString>
#include <functional>

namespace quotas {

// What a run did, for the command line and the tests; the user learns it
// from the run's own messages.
struct ImportSummary {
    int lines = 0;            // source lines visited
    int posted = 0;           // lines whose deduction was posted
    int rejected = 0;         // lines listed in extras (failed ones included)
    int failed = 0;           // matched lines whose writes were rolled back
    bool extrasSaved = true;  // false when extras could not be rewritten
    // Why no line was gone through (no lines, no no_tap or quota column, no
    // dues charged, the dues unreadable), as the run told it; empty otherwise.
    QString refusal;

    // Lines posted, left alone (posted before) and rejected, one per line,
    // for the dialog's closing message.
    QString counts() const;
};

// Posts the employer's list of deductions, obtained from the import source
// "Dorvanta.General", against the dues charged for month, year and tipo
// (1 the union due, anything else the insurance due), on Data().SqlServer.
//
// - Lines are matched by their first value to the members' no_tap, exactly
//   and through indexes built once per run; no value from the file reaches
//   SQL text. A line is posted when the movement is unpaid and the
//   deduction is not 0, or when the deduction exceeds the charge; the
//   movement's and the account's writes of a line commit together.
// - Lines without a movement or an account, with an amount that cannot be
//   read, or whose writes failed are rejected: counted in the final message,
//   written to extras (rewritten in one transaction) and listed.
// - Amounts are read with "." or "," as decimal separator, divided by 100
//   when shared().SemSeparadorDecimal is set, and kept in whole cents.
// - The source's failures (no file readable, say) pass to the caller as
//   QuotasError before anything is changed.
// - With verdicts, what was done with each line is added to it.
ImportSummary ProcessarImportacao(int month, int year, int tipo, ImportVerdicts* verdicts = nullptr);

// The import's dry run: reads the list and decides every line exactly as
// ProcessarImportacao does (the same code decides), adding the verdicts to
// verdicts, and writes nothing at all: not the movements, not the accounts,
// not extras; no rejects listing. Its messages are the import's for a list
// it cannot go through. rejected counts the lines it would reject.
ImportSummary SimularImportacao(int month, int year, int tipo, ImportVerdicts& verdicts);

// What the run does to show the rejects listing, after extras has been
// rewritten, with SqlServer_Prints open: showRejectsListing() unless
// replaced (the command line writes a PDF instead; the tests record the
// call). Returns the one it replaces; an empty function restores the preview.
using RejectsListing = std::function<void()>;
RejectsListing setRejectsListing(RejectsListing listing);

}  // namespace quotas
