#pragma once

#include <QString>

namespace quotas {

// The database password is stored as "b64:" followed by the Base64 of its
// UTF-8 bytes. This keeps it from being read at a glance; the protection is
// the settings file's owner-only mode. A stored value without the prefix is
// taken as the password itself (a value typed in by hand).
QString encodePassword(const QString& plain);
QString decodePassword(const QString& stored);

}  // namespace quotas
