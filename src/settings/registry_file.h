#pragma once

#include <QByteArray>
#include <QHash>
#include <QString>
#include <optional>
#include <vector>

namespace quotas {

// A settings file in the Windows registry export format
// ("Windows Registry Editor Version 5.00" or "REGEDIT4", UTF-8 or UTF-16
// with BOM), so an administrator can bring the key of an old installation.
// Key and value names are matched without regard to case, as the registry does.
class RegistryFile {
public:
    // Throws QuotasError when the file cannot be read or is not such an export.
    static RegistryFile load(const QString& path);
    static RegistryFile parse(const QByteArray& bytes);

    // A key exists when the file names it or a key below it.
    bool hasKey(const QString& fullKey) const;
    // The value's data as the registry's single-byte functions return it:
    // text in Windows-1252 with its terminator, numbers and binary as stored.
    std::optional<QByteArray> data(const QString& fullKey, const QString& valueName) const;

    void setString(const QString& fullKey, const QString& valueName, const QString& value);

    // Writes the file in the header, encoding and line ends it was read
    // with; a new file is "Windows Registry Editor Version 5.00" in UTF-8
    // with CRLF, as the registry editor writes it.
    QByteArray serialize() const;
    // Replaces the file at once (never half-written), readable by its owner
    // only. A file the reader would not read back is not written.
    void save(const QString& path) const;

    enum class Encoding {
        Utf8,
        Utf8Bom,
        Utf16LE,
        Utf16BE,
        CodePage1252
    };

private:
    enum : int {
        String = 1,
        ExpandString = 2,
        Binary = 3,
        Dword = 4,
        MultiString = 7,
        Qword = 11
    };
    struct Value {
        QString name;  // empty: the key's default value "@"
        int type = String;
        QString text;           // String
        QByteArray bytes;       // every other type, as written in the file
        bool wideText = false;  // hex(2)/hex(7) bytes are UTF-16 (version 5 files)
    };
    struct Key {
        QString path;
        std::vector<Value> values;
        QHash<QString, size_t> byName;  // lower-cased name -> position in values

        void reindex();
    };

    Key* findKey(const QString& fullKey);
    const Key* findKey(const QString& fullKey) const;
    Key& addKey(const QString& fullKey);
    void reindexKeys();
    void parseLine(const QString& line, int lineNumber, Key*& current, bool unicode);

    std::vector<Key> m_keys;
    QHash<QString, size_t> m_keyIndex;  // lower-cased path -> position in m_keys
    Encoding m_encoding = Encoding::Utf8;
    bool m_crlf = true;
    bool m_version5 = true;
};

}  // namespace quotas
