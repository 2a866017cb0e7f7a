#include "platform/dialect.h"

#include <vector>

namespace quotas {

namespace {

enum class TokenKind {
    Literal,
    Plus,
    Space,
    Other
};

struct Token {
    TokenKind kind;
    QString text;
};

std::vector<Token> tokenize(const QString& sql)
{
    std::vector<Token> tokens;
    const qsizetype n = sql.size();
    qsizetype i = 0;
    while (i < n) {
        const QChar c = sql[i];
        qsizetype start = i;
        if (c == u'\'' || c == u'"') {
            // Literals and quoted names, with the quote doubled inside.
            ++i;
            while (i < n) {
                if (sql[i] == c) {
                    if (i + 1 < n && sql[i + 1] == c) {
                        i += 2;
                        continue;
                    }
                    ++i;
                    break;
                }
                ++i;
            }
            tokens.push_back({c == u'\'' ? TokenKind::Literal : TokenKind::Other, sql.mid(start, i - start)});
        } else if (c == u'-' && i + 1 < n && sql[i + 1] == u'-') {
            while (i < n && sql[i] != u'\n')
                ++i;
            tokens.push_back({TokenKind::Space, sql.mid(start, i - start)});
        } else if (c.isSpace()) {
            while (i < n && sql[i].isSpace())
                ++i;
            tokens.push_back({TokenKind::Space, sql.mid(start, i - start)});
        } else if (c == u'+') {
            ++i;
            tokens.push_back({TokenKind::Plus, QStringLiteral("+")});
        } else if (c.isLetterOrNumber() || c == u'_' || c == u'.') {
            while (i < n && (sql[i].isLetterOrNumber() || sql[i] == u'_' || sql[i] == u'.'))
                ++i;
            tokens.push_back({TokenKind::Other, sql.mid(start, i - start)});
        } else {
            ++i;
            tokens.push_back({TokenKind::Other, sql.mid(start, 1)});
        }
    }
    return tokens;
}

const Token* neighbour(const std::vector<Token>& tokens, size_t at, int step)
{
    for (long j = long(at) + step; j >= 0 && j < long(tokens.size()); j += step) {
        if (tokens[size_t(j)].kind != TokenKind::Space)
            return &tokens[size_t(j)];
    }
    return nullptr;
}

}  // namespace

QString Dialect::driverName() const
{
    return m_engine == Engine::SQLite ? QStringLiteral("QSQLITE") : QStringLiteral("QPSQL");
}

QString Dialect::translate(const QString& sql) const
{
    const auto cached = m_translated.constFind(sql);
    if (cached != m_translated.constEnd())
        return *cached;
    QString out;
    if (m_engine == Engine::PostgreSQL && sql.contains(QStringLiteral("COLLATE portugues"))) {
        // The server's ICU collation for Portuguese (Portugal), whatever the
        // database's own locale.
        QString withCollation = sql;
        withCollation.replace(QStringLiteral("COLLATE portugues"), QStringLiteral("COLLATE \"pt-PT-x-icu\""));
        out = translate(withCollation);
        m_translated.insert(sql, out);
        return out;
    }
    if (!sql.contains(u'+')) {
        out = sql;
    } else {
        const auto tokens = tokenize(sql);
        out.reserve(sql.size() + 8);
        for (size_t t = 0; t < tokens.size(); ++t) {
            if (tokens[t].kind == TokenKind::Plus) {
                const Token* before = neighbour(tokens, t, -1);
                const Token* after = neighbour(tokens, t, +1);
                const bool joinsText = (before && before->kind == TokenKind::Literal)
                                       || (after && after->kind == TokenKind::Literal);
                out += joinsText ? QStringLiteral("||") : QStringLiteral("+");
            } else {
                out += tokens[t].text;
            }
        }
    }
    m_translated.insert(sql, out);
    return out;
}

QString Dialect::beginTransaction() const
{
    // SQLite: take the writer lock at once, so two writers queue on the busy
    // timeout instead of failing when a reader tries to become a writer.
    return m_engine == Engine::SQLite ? QStringLiteral("BEGIN IMMEDIATE") : QStringLiteral("BEGIN");
}

QString Dialect::lazyCommits(bool on) const
{
    // SQLite in WAL mode with synchronous=NORMAL already commits without
    // waiting for the disk.
    if (m_engine == Engine::SQLite)
        return QString();
    return on ? QStringLiteral("SET synchronous_commit TO OFF") : QStringLiteral("RESET synchronous_commit");
}

QString Dialect::durableMark() const
{
    return m_engine == Engine::SQLite ? QString() : QStringLiteral("SELECT txid_current()");
}

QString Dialect::nullSafeEquals(const QString& column) const
{
    return m_engine == Engine::SQLite ? column + QStringLiteral(" IS ?")
                                      : column + QStringLiteral(" IS NOT DISTINCT FROM ?");
}

QString Dialect::addToColumn(const QString& column) const
{
    // PostgreSQL keeps money in NUMERIC(12,2), which holds whole cents by itself.
    return m_engine == Engine::SQLite ? QStringLiteral("ROUND(COALESCE(%1, 0) + ?, 2)").arg(column)
                                      : QStringLiteral("COALESCE(%1, 0) + ?").arg(column);
}

QString Dialect::forUpdate() const
{
    return m_engine == Engine::SQLite ? QString() : QStringLiteral(" FOR UPDATE");
}

QString Dialect::transactionLock() const
{
    return m_engine == Engine::SQLite ? QString() : QStringLiteral("SELECT pg_advisory_xact_lock(?, ?)");
}

QString Dialect::rowAddress() const
{
    return m_engine == Engine::SQLite ? QStringLiteral("rowid") : QStringLiteral("ctid");
}

QString Dialect::catalogName(const QString& table) const
{
    return m_engine == Engine::PostgreSQL ? table.toLower() : table;
}

}  // namespace quotas
