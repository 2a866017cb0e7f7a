#include "settings/registry_file.h"

#include "platform/errors.h"
#include "settings/code_page.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QSaveFile>
#include <QStringDecoder>
#include <QStringEncoder>
#include <algorithm>
#include <sys/stat.h>

namespace quotas {

namespace {

const QString kVersion5 = QStringLiteral("Windows Registry Editor Version 5.00");
const QString kVersion4 = QStringLiteral("REGEDIT4");

[[noreturn]] void malformed(int line, const QString& why)
{
    throw QuotasError(QStringLiteral("Ficheiro de configuração inválido (linha %1): %2").arg(line).arg(why));
}

// Reads a quoted text starting at text[at] == '"'; returns the unescaped text
// and moves at past the closing quote.
QString readQuoted(const QString& text, qsizetype& at, int line)
{
    QString out;
    ++at;
    while (at < text.size()) {
        const QChar c = text[at];
        if (c == u'\\' && at + 1 < text.size()) {
            out += text[at + 1];
            at += 2;
            continue;
        }
        if (c == u'"') {
            ++at;
            return out;
        }
        out += c;
        ++at;
    }
    malformed(line, QStringLiteral("falta fechar as aspas."));
}

QString escaped(const QString& text)
{
    QString out = text;
    out.replace(u'\\', QStringLiteral("\\\\"));
    out.replace(u'"', QStringLiteral("\\\""));
    return u'"' + out + u'"';
}

QByteArray parseHex(const QString& text, int line)
{
    QByteArray out;
    const auto parts = text.split(u',', Qt::SkipEmptyParts);
    for (const QString& part : parts) {
        bool ok = false;
        const uint byte = part.trimmed().toUInt(&ok, 16);
        if (!ok || byte > 0xFF)
            malformed(line, QStringLiteral("byte hexadecimal inválido \"%1\".").arg(part.trimmed()));
        out.append(char(byte));
    }
    return out;
}

QString decodeFile(const QByteArray& bytes, RegistryFile::Encoding& encoding)
{
    using Encoding = RegistryFile::Encoding;
    if (bytes.startsWith("\xFF\xFE")) {
        encoding = Encoding::Utf16LE;
        auto decoder = QStringDecoder(QStringDecoder::Utf16LE, QStringDecoder::Flag::Stateless);
        return decoder(bytes.mid(2));
    }
    if (bytes.startsWith("\xFE\xFF")) {
        encoding = Encoding::Utf16BE;
        auto decoder = QStringDecoder(QStringDecoder::Utf16BE, QStringDecoder::Flag::Stateless);
        return decoder(bytes.mid(2));
    }
    const bool mark = bytes.startsWith("\xEF\xBB\xBF");
    const QByteArray body = mark ? bytes.mid(3) : bytes;
    auto utf8 = QStringDecoder(QStringDecoder::Utf8, QStringDecoder::Flag::Stateless | QStringDecoder::Flag::ConvertInitialBom);
    QString text = utf8(body);
    if (!utf8.hasError()) {
        encoding = mark ? Encoding::Utf8Bom : Encoding::Utf8;
        return text;
    }
    encoding = Encoding::CodePage1252;
    return fromCodePage1252(body);  // an old REGEDIT4 file in the ANSI code page
}

QByteArray encodeFile(const QString& text, RegistryFile::Encoding encoding)
{
    using Encoding = RegistryFile::Encoding;
    switch (encoding) {
    case Encoding::Utf16LE:
    case Encoding::Utf16BE: {
        const bool little = encoding == Encoding::Utf16LE;
        QStringEncoder encoder(little ? QStringEncoder::Utf16LE : QStringEncoder::Utf16BE, QStringEncoder::Flag::Stateless);
        const QByteArray body = encoder(text);
        return (little ? QByteArray("\xFF\xFE") : QByteArray("\xFE\xFF")) + body;
    }
    case Encoding::Utf8Bom:
        return QByteArray("\xEF\xBB\xBF") + text.toUtf8();
    case Encoding::CodePage1252: {
        // Once a line with the byte that made the file ANSI is gone, what is
        // left may also be valid UTF-8 and would be read back as such, every
        // accented letter changed; with the UTF-8 mark it reads back as it was.
        QByteArray ansi = toCodePage1252(text);
        const bool ascii = std::all_of(ansi.begin(), ansi.end(), [](char c) { return uchar(c) < 0x80; });
        if (ascii || !QByteArrayView(ansi).isValidUtf8())
            return ansi;
        return QByteArray("\xEF\xBB\xBF") + text.toUtf8();
    }
    case Encoding::Utf8:
        break;
    }
    return text.toUtf8();
}

}  // namespace

RegistryFile RegistryFile::load(const QString& path)
{
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly))
        throw QuotasError(QStringLiteral("Não foi possível ler o ficheiro de configuração \"%1\": %2").arg(path, file.errorString()));
    try {
        return parse(file.readAll());
    } catch (const QuotasError& e) {
        throw QuotasError(QStringLiteral("%1: %2").arg(path, e.message()));
    }
}

RegistryFile RegistryFile::parse(const QByteArray& bytes)
{
    RegistryFile result;
    const QString text = decodeFile(bytes, result.m_encoding);
    const QStringList lines = text.split(u'\n');
    result.m_crlf = !text.contains(u'\n') || text.contains(QStringLiteral("\r\n"));
    Key* current = nullptr;
    bool headerSeen = false;
    bool unicode = true;
    for (int i = 0; i < lines.size(); ++i) {
        QString line = lines[i];
        if (line.endsWith(u'\r'))
            line.chop(1);
        const int lineNumber = i + 1;
        if (!headerSeen) {
            if (line.trimmed().isEmpty())
                continue;
            if (line.trimmed() == kVersion5)
                unicode = true;
            else if (line.trimmed() == kVersion4)
                unicode = false;
            else
                malformed(lineNumber, QStringLiteral("não é uma exportação do registo."));
            headerSeen = true;
            result.m_version5 = unicode;
            continue;
        }
        // Binary values may continue over several lines ending in "\".
        while (line.trimmed().endsWith(u'\\') && line.contains(QStringLiteral("=hex")) && i + 1 < lines.size()) {
            line = line.trimmed();
            line.chop(1);
            QString next = lines[++i];
            if (next.endsWith(u'\r'))
                next.chop(1);
            line += next.trimmed();
        }
        result.parseLine(line, lineNumber, current, unicode);
    }
    if (!headerSeen)
        malformed(1, QStringLiteral("o ficheiro está vazio."));
    return result;
}

void RegistryFile::parseLine(const QString& raw, int lineNumber, Key*& current, bool unicode)
{
    const QString line = raw.trimmed();
    if (line.isEmpty() || line.startsWith(u';'))
        return;
    if (line.startsWith(u'[')) {
        if (!line.endsWith(u']'))
            malformed(lineNumber, QStringLiteral("falta \"]\" no nome da chave."));
        QString path = line.mid(1, line.size() - 2);
        if (path.startsWith(u'-')) {
            path = path.mid(1);
            std::erase_if(m_keys, [&](const Key& k) {
                return k.path.compare(path, Qt::CaseInsensitive) == 0
                       || k.path.startsWith(path + u'\\', Qt::CaseInsensitive);
            });
            reindexKeys();
            current = nullptr;
            return;
        }
        current = &addKey(path);
        return;
    }
    if (!current)
        malformed(lineNumber, QStringLiteral("valor fora de uma chave."));
    qsizetype at = 0;
    QString name;
    if (line.startsWith(u'@')) {
        at = 1;
    } else if (line.startsWith(u'"')) {
        name = readQuoted(line, at, lineNumber);
    } else {
        malformed(lineNumber, QStringLiteral("nome de valor inválido."));
    }
    while (at < line.size() && line[at] == u' ')
        ++at;
    if (at >= line.size() || line[at] != u'=')
        malformed(lineNumber, QStringLiteral("falta \"=\"."));
    ++at;
    while (at < line.size() && line[at] == u' ')
        ++at;
    const QString data = line.mid(at);
    const auto existing = current->byName.constFind(name.toLower());
    if (data == QStringLiteral("-")) {
        if (existing != current->byName.constEnd()) {
            current->values.erase(current->values.begin() + qsizetype(*existing));
            current->reindex();
        }
        return;
    }
    Value value;
    value.name = name;
    if (data.startsWith(u'"')) {
        qsizetype q = 0;
        value.text = readQuoted(data, q, lineNumber);
        value.type = String;
    } else if (data.startsWith(QStringLiteral("dword:"), Qt::CaseInsensitive)) {
        bool ok = false;
        const quint32 number = data.mid(6).trimmed().toUInt(&ok, 16);
        if (!ok)
            malformed(lineNumber, QStringLiteral("valor dword inválido."));
        value.type = Dword;
        for (int b = 0; b < 4; ++b)
            value.bytes.append(char((number >> (8 * b)) & 0xFF));
    } else if (data.startsWith(QStringLiteral("hex"), Qt::CaseInsensitive)) {
        const qsizetype colon = data.indexOf(u':');
        if (colon < 0)
            malformed(lineNumber, QStringLiteral("valor hexadecimal inválido."));
        const QString kind = data.left(colon);
        value.type = Binary;
        if (kind.size() > 3) {
            bool ok = false;
            value.type = kind.mid(4, kind.size() - 5).toInt(&ok, 16);
            if (!ok || !kind.startsWith(QStringLiteral("hex("), Qt::CaseInsensitive) || !kind.endsWith(u')'))
                malformed(lineNumber, QStringLiteral("tipo de valor inválido \"%1\".").arg(kind));
        }
        value.bytes = parseHex(data.mid(colon + 1), lineNumber);
        value.wideText = unicode && (value.type == ExpandString || value.type == MultiString);
    } else {
        malformed(lineNumber, QStringLiteral("valor inválido."));
    }
    // A value named again replaces the earlier one, in its place.
    if (existing != current->byName.constEnd()) {
        current->values[*existing] = std::move(value);
    } else {
        current->byName.insert(name.toLower(), current->values.size());
        current->values.push_back(std::move(value));
    }
}

void RegistryFile::Key::reindex()
{
    byName.clear();
    for (size_t i = 0; i < values.size(); ++i)
        byName.insert(values[i].name.toLower(), i);
}

void RegistryFile::reindexKeys()
{
    m_keyIndex.clear();
    for (size_t i = 0; i < m_keys.size(); ++i)
        m_keyIndex.insert(m_keys[i].path.toLower(), i);
}

RegistryFile::Key& RegistryFile::addKey(const QString& fullKey)
{
    if (Key* key = findKey(fullKey))
        return *key;
    m_keyIndex.insert(fullKey.toLower(), m_keys.size());
    m_keys.push_back({fullKey, {}, {}});
    return m_keys.back();
}

RegistryFile::Key* RegistryFile::findKey(const QString& fullKey)
{
    const auto found = m_keyIndex.constFind(fullKey.toLower());
    return found == m_keyIndex.constEnd() ? nullptr : &m_keys[*found];
}

const RegistryFile::Key* RegistryFile::findKey(const QString& fullKey) const
{
    return const_cast<RegistryFile*>(this)->findKey(fullKey);
}

bool RegistryFile::hasKey(const QString& fullKey) const
{
    for (const Key& k : m_keys) {
        if (k.path.compare(fullKey, Qt::CaseInsensitive) == 0 || k.path.startsWith(fullKey + u'\\', Qt::CaseInsensitive))
            return true;
    }
    return false;
}

std::optional<QByteArray> RegistryFile::data(const QString& fullKey, const QString& valueName) const
{
    const Key* key = findKey(fullKey);
    if (!key)
        return std::nullopt;
    const auto found = key->byName.constFind(valueName.toLower());
    if (found != key->byName.constEnd()) {
        const Value& v = key->values[*found];
        if (v.type == String)
            return toCodePage1252(v.text) + QByteArray(1, '\0');
        if (v.wideText) {
            QString wide;
            for (qsizetype i = 0; i + 1 < v.bytes.size(); i += 2)
                wide.append(QChar(char16_t(uchar(v.bytes[i]) | (uchar(v.bytes[i + 1]) << 8))));
            return toCodePage1252(wide);
        }
        return v.bytes;
    }
    return std::nullopt;
}

void RegistryFile::setString(const QString& fullKey, const QString& valueName, const QString& value)
{
    Key& key = addKey(fullKey);
    const auto found = key.byName.constFind(valueName.toLower());
    if (found != key.byName.constEnd()) {
        key.values[*found] = Value{valueName, String, value, {}, false};
        return;
    }
    key.byName.insert(valueName.toLower(), key.values.size());
    key.values.push_back(Value{valueName, String, value, {}, false});
}

QByteArray RegistryFile::serialize() const
{
    const QString end = m_crlf ? QStringLiteral("\r\n") : QStringLiteral("\n");
    QString out = (m_version5 ? kVersion5 : kVersion4) + end;
    for (const Key& k : m_keys) {
        out += end + u'[' + k.path + u']' + end;
        for (const Value& v : k.values) {
            out += v.name.isEmpty() ? QStringLiteral("@") : escaped(v.name);
            out += u'=';
            if (v.type == String) {
                out += escaped(v.text);
            } else if (v.type == Dword && v.bytes.size() == 4) {
                quint32 n = 0;
                for (int b = 0; b < 4; ++b)
                    n |= quint32(uchar(v.bytes[b])) << (8 * b);
                out += QStringLiteral("dword:%1").arg(n, 8, 16, QLatin1Char('0'));
            } else {
                out += v.type == Binary ? QStringLiteral("hex:") : QStringLiteral("hex(%1):").arg(v.type, 0, 16);
                QStringList bytes;
                for (const char b : v.bytes)
                    bytes << QStringLiteral("%1").arg(uint(uchar(b)), 2, 16, QLatin1Char('0'));
                out += bytes.join(u',');
            }
            out += end;
        }
    }
    return encodeFile(out, m_encoding);
}

void RegistryFile::save(const QString& path) const
{
    const QByteArray bytes = serialize();
    parse(bytes);  // throws, and nothing is written, when it would not read back
    const QFileInfo info(path);
    if (!QDir().mkpath(info.absolutePath()))
        throw QuotasError(QStringLiteral("Não foi possível criar a pasta \"%1\".").arg(info.absolutePath()));
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        throw QuotasError(QStringLiteral("Não foi possível escrever \"%1\": %2").arg(path, file.errorString()));
    // The file holds the database password: owner only, before any byte is written.
    if (::fchmod(file.handle(), S_IRUSR | S_IWUSR) != 0)
        throw QuotasError(QStringLiteral("Não foi possível proteger \"%1\".").arg(path));
    file.write(bytes);
    if (!file.commit())
        throw QuotasError(QStringLiteral("Não foi possível escrever \"%1\": %2").arg(path, file.errorString()));
}

}  // namespace quotas
