#pragma once

#include <QList>
#include <QString>
#include <QVariant>

namespace quotas {

class Connection;

// Which month's dues to take back: one type (1 or 2) or both (0), one member
// (socio_id) or all (0).
struct UndoChoice {
    int ano = 0;
    int mes = 0;
    int tipo = 0;
    int socio = 0;
};

// One due of the chosen month and why it stays (empty when it goes).
struct UndoDue {
    QVariant quotaId;
    QVariant socioId;
    QString noTap;
    QString nome;
    int tipo = 0;
    double quota = 0;
    QString keptBecause;
};

// What an undo would do, read without changing anything.
struct UndoPlan {
    UndoChoice choice;
    QList<UndoDue> removed;  // in member order
    QList<UndoDue> kept;

    // Counts and sums per type, then both lists.
    QString text() const;
    // The question asked before anything is removed.
    QString confirmation() const;
};

struct UndoOutcome {
    int removed = 0;
    double amount = 0;
    // Dues of the plan that someone paid or changed meanwhile: they stay.
    int changedMeanwhile = 0;

    QString summary(const UndoChoice& choice) const;
};

// Reads the month's dues and decides which go: those nothing has touched
// since they were generated (pago 0, no document, not written by the import).
UndoPlan planUndo(Connection& connection, const UndoChoice& choice);

// Removes the plan's dues member by member: each member's removals and the
// decrease of his account's total commit together, under the same lock the
// generation takes on the member. A due paid or changed since the plan was
// read stays. The account's last values and the due counter are left alone.
UndoOutcome AnularGeracao(Connection& connection, const UndoPlan& plan);

}  // namespace quotas
