#include "schema/demo_data.h"

#include "platform/connection.h"
#include "platform/transaction.h"

#include <QDate>
#include <QStringList>
#include <QVariantList>

namespace quotas {

namespace {

const char* const kMaleNames[] = {"João", "José", "António", "Manuel", "Francisco", "Luís", "Carlos", "Paulo",
                                  "Pedro", "Rui", "Miguel", "Jorge", "Fernando", "Ricardo", "Nuno", "Vítor"};
const char* const kFemaleNames[] = {"Maria", "Ana", "Isabel", "Rosa", "Teresa", "Helena", "Sofia", "Catarina",
                                    "Inês", "Joana", "Marta", "Fátima", "Conceição", "Graça", "Beatriz", "Lúcia"};
const char* const kSurnames[] = {"Silva", "Santos", "Ferreira", "Pereira", "Oliveira", "Costa", "Rodrigues",
                                 "Martins", "Jesus", "Sousa", "Fernandes", "Gonçalves", "Gomes", "Lopes",
                                 "Marques", "Alves", "Almeida", "Ribeiro", "Pinto", "Carvalho", "Teixeira",
                                 "Moreira", "Correia", "Mendes", "Nunes", "Soares", "Vieira", "Monteiro",
                                 "Cardoso", "Rocha", "Raposo", "Neves", "Coelho", "Cruz", "Cunha"};
const char* const kStreets[] = {"Rua Augusta", "Avenida da Liberdade", "Rua do Ouro", "Rua da Prata",
                                "Avenida de Roma", "Rua Morais Soares", "Estrada de Benfica", "Rua de Santa Marta",
                                "Avenida Almirante Reis", "Rua da Junqueira", "Calçada da Ajuda", "Rua do Carmo"};
struct Town {
    const char* postcode;
    const char* name;
};
// clang-format off
const Town kTowns[] = {{"1100-053", "Lisboa"}, {"1700-111", "Lisboa"},  {"2700-356", "Amadora"},
                       {"2790-045", "Carnaxide"}, {"2685-223", "Portela"}, {"4000-322", "Porto"},
                       {"8000-164", "Faro"},    {"2910-512", "Setúbal"}, {"2600-098", "Vila Franca de Xira"}};
// clang-format on

// Categories and employers of the demo; members whose code is not among them
// exercise the defaults of the dues generation.
const char* const kCategories[] = {"A1", "A2", "B1", "B2", "C1", "C2"};
const char* const kEmployers[] = {"TAP", "PGA", "SPD", "GRD"};

// A small generator of our own, so the demo is the same on every machine.
class Sequence {
public:
    explicit Sequence(quint64 seed) : m_state(seed * 6364136223846793005ULL + 1442695040888963407ULL) {}
    quint32 next(quint32 bound)
    {
        m_state = m_state * 6364136223846793005ULL + 1442695040888963407ULL;
        return quint32((m_state >> 33) % bound);
    }

private:
    quint64 m_state;
};

template <typename T, size_t N>
const T& pick(Sequence& s, const T (&items)[N])
{
    return items[s.next(quint32(N))];
}

void addReferenceData(Connection& c)
{
    if (c.scalar(QStringLiteral("SELECT COUNT(*) FROM tbfuvs")).toInt() == 0) {
        const QVariantList rows[] = {
            {QStringLiteral("A1"), QStringLiteral("Técnico Superior"), 2500.00},
            {QStringLiteral("A2"), QStringLiteral("Técnico"), 1800.00},
            {QStringLiteral("B1"), QStringLiteral("Administrativo"), 1200.00},
            {QStringLiteral("B2"), QStringLiteral("Operacional"), 950.00},
            {QStringLiteral("C1"), QStringLiteral("Chefia"), 3200.00},
            {QStringLiteral("C2"), QStringLiteral("Direcção"), 4100.50},
        };
        for (const QVariantList& row : rows)
            c.execute(QStringLiteral("INSERT INTO tbfuvs (code, descrit, rend1) VALUES (?, ?, ?)"), row);
    }
    if (c.scalar(QStringLiteral("SELECT COUNT(*) FROM tbEmpresas")).toInt() == 0) {
        const QVariantList rows[] = {
            {QStringLiteral("TAP"), QStringLiteral("Transportes Aéreos Portugueses"), 0.015},
            {QStringLiteral("PGA"), QStringLiteral("Portugália"), 0.01},
            {QStringLiteral("SPD"), QStringLiteral("Serviços Portugueses de Handling"), 0.0125},
            {QStringLiteral("GRD"), QStringLiteral("Groundforce"), 0.015},
        };
        for (const QVariantList& row : rows)
            c.execute(QStringLiteral("INSERT INTO tbEmpresas (code, nome, percent_sindicato) VALUES (?, ?, ?)"), row);
    }
}

}  // namespace

int addDemoMembers(Connection& c, int count)
{
    Transaction tx(c);
    addReferenceData(c);
    // Staff numbers continue after the members already there.
    const int first = c.scalar(QStringLiteral("SELECT COUNT(*) FROM tbSocios")).toInt() + 1;
    const QString insert = QStringLiteral(
        "INSERT INTO tbSocios (no_tap, nome, nome_guerra, morada1, code_postal1, localidade1, fuv, empresa, seguro, "
        "seguro_data_rescisao) VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?)");
    for (int n = first; n < first + count; ++n) {
        Sequence s{quint64(n)};
        const bool female = s.next(2) == 1;
        const QString given = QString::fromUtf8(female ? pick(s, kFemaleNames) : pick(s, kMaleNames));
        const QString middle = QString::fromUtf8(pick(s, kSurnames));
        const QString last = QString::fromUtf8(pick(s, kSurnames));
        const Town& town = pick(s, kTowns);
        const quint32 roll = s.next(100);
        QVariant category = QString::fromLatin1(pick(s, kCategories));
        if (roll < 3)
            category = QStringLiteral("Z9");  // a category the table does not know
        else if (roll < 5)
            category = QVariant(QMetaType::fromType<QString>());
        QVariant employer = QString::fromLatin1(pick(s, kEmployers));
        if (s.next(100) < 4)
            employer = QStringLiteral("XPT");  // an employer the table does not know
        const bool insured = s.next(100) < 40;
        QVariant insuranceEnd = QVariant(QMetaType::fromType<QDate>());
        if (insured && s.next(100) < 20)
            insuranceEnd = QDate(2025 + int(s.next(3)), 1 + int(s.next(12)), 1).addMonths(1).addDays(-1);
        c.execute(insert, {QString::number(100000 + n), given + u' ' + middle + u' ' + last, given + u' ' + last,
                           QString::fromUtf8(pick(s, kStreets)) + QStringLiteral(", %1").arg(1 + s.next(240)),
                           QString::fromLatin1(town.postcode), QString::fromUtf8(town.name), category, employer,
                           insured ? 1 : 0, insuranceEnd});
    }
    tx.commit();
    return count;
}

}  // namespace quotas
