#pragma once

#include <QString>
#include <QVariant>

namespace quotas::registry {

// Predefined roots, matched exactly and with case.
constexpr quint32 HKEY_CLASSES_ROOT = 0x80000000;
constexpr quint32 HKEY_CURRENT_USER = 0x80000001;
constexpr quint32 HKEY_LOCAL_MACHINE = 0x80000002;
constexpr quint32 HKEY_USERS = 0x80000003;
constexpr quint32 HKEY_PERFORMANCE_DATA = 0x80000004;
constexpr quint32 HKEY_CURRENT_CONFIG = 0x80000005;
constexpr quint32 HKEY_DYN_DATA = 0x80000006;

// Root name to handle; 0 for any other name.
quint32 RootKeyHandle(const QString& rootName);

// Splits "ROOT\sub\key" into the root and the sub key, rewriting keyPath to
// the sub key. A path that does not start with "HKEY_" or ends in "\" is
// malformed: a message box says so and root becomes 0.
void ParseKeyPath(QString& keyPath, quint32& root);

// Reads one value of the settings store. keyPath is rewritten to its sub key
// (callers pass a copy). Result: the text; the null marker when the key or
// value cannot be read (a value longer than 254 characters cannot); an empty
// variant when the path names no known root. Leading spaces are trimmed,
// trailing spaces kept.
QVariant QueryValue(QString& keyPath, QString& valueName);

// The null marker is a valid variant holding null; the empty variant is invalid.
QVariant nullMarker();
bool isNullMarker(const QVariant& value);
bool isEmptyVariant(const QVariant& value);

}  // namespace quotas::registry
