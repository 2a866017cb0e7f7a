#include "platform/sqlite_collation.h"

#include <QCollator>
#include <QSqlDatabase>
#include <QSqlDriver>
#include <sqlite3.h>

namespace quotas {

namespace {

int comparePortuguese(void* collator, int leftBytes, const void* left, int rightBytes, const void* right)
{
    // SQLite hands the texts in the machine's UTF-16, lengths in bytes.
    const QStringView a(static_cast<const char16_t*>(left), leftBytes / 2);
    const QStringView b(static_cast<const char16_t*>(right), rightBytes / 2);
    return static_cast<const QCollator*>(collator)->compare(a, b);
}

void releaseCollator(void* collator)
{
    delete static_cast<QCollator*>(collator);
}

}  // namespace

bool registerPortugueseCollation(QSqlDatabase& db)
{
    const QVariant handle = db.driver()->handle();
    if (!handle.isValid() || qstrcmp(handle.typeName(), "sqlite3*") != 0)
        return false;
    sqlite3* connection = *static_cast<sqlite3* const*>(handle.constData());
    if (!connection)
        return false;
    auto* collator = new QCollator(QLocale(QLocale::Portuguese, QLocale::Portugal));
    collator->setCaseSensitivity(Qt::CaseSensitive);
    // SQLite owns the collator from here on, also when registering fails.
    return sqlite3_create_collation_v2(connection, "portugues", SQLITE_UTF16, collator, comparePortuguese,
                                       releaseCollator)
           == SQLITE_OK;
}

}  // namespace quotas
