#include "import/csv_reader.h"

#include "import/text_encoding.h"
#include "platform/errors.h"

#include <QBuffer>
#include <QFile>
#include <QFileInfo>
#include <QStringDecoder>
#include <algorithm>
#include <array>
#include <csv.h>

namespace quotas {

namespace {

// The file is read this much at a time.
constexpr qint64 kBlock = 64 * 1024;

int spaceOnly(unsigned char c)
{
    return c == ' ' ? 1 : 0;
}

QString invalidCsv(const QString& fileName, const QString& reason)
{
    return QStringLiteral("O ficheiro \"%1\" não é um ficheiro CSV válido: %2").arg(fileName, reason);
}

QString notText(const QString& fileName)
{
    return QStringLiteral("O ficheiro \"%1\" não é um ficheiro de texto CSV.").arg(fileName);
}

bool startsUtf16(const QByteArray& bytes)
{
    return bytes.startsWith("\xFF\xFE") || bytes.startsWith("\xFE\xFF");
}

}  // namespace

// Parses a device from its start a block at a time, into records of bytes:
// UTF-8, or the file's own single-byte code page (libcsv only looks at
// quotes, delimiters, spaces and line breaks, which both write alike).
class CsvLines::Scanner {
public:
    Scanner(QIODevice& device, const QString& fileName, char delimiter, bool utf16, bool decoded)
        : m_device(device), m_fileName(fileName), m_utf16(utf16), m_decoded(decoded)
    {
        if (csv_init(&m_parser, CSV_STRICT | CSV_STRICT_FINI) != 0)
            throw QuotasError(QStringLiteral("Não foi possível preparar a leitura do ficheiro CSV."));
        csv_set_delim(&m_parser, static_cast<unsigned char>(delimiter));
        // The field buffer grows by this much at a time: the default of 128
        // bytes makes a long line cost a reallocation every few values.
        csv_set_blk_size(&m_parser, 64 * 1024);
        // With tab as the delimiter a tab must not be taken for padding.
        if (delimiter == '\t')
            csv_set_space_func(&m_parser, spaceOnly);
        m_device.seek(0);
    }
    ~Scanner() { csv_free(&m_parser); }
    Scanner(const Scanner&) = delete;
    Scanner& operator=(const Scanner&) = delete;

    // Parses the next block, adding the records it completes to out; false
    // when the whole file had been parsed already.
    bool readBlock(std::deque<Record>& out)
    {
        if (m_finished)
            return false;
        const QByteArray block = m_device.read(kBlock);
        if (block.isEmpty() && !m_device.atEnd())
            throw QuotasError(QStringLiteral("Não foi possível ler o ficheiro \"%1\".").arg(m_fileName));
        if (m_utf16) {
            m_text += QString(m_fromUtf16(block)).toUtf8();  // follows the mark
        } else {
            m_text += block;
            if (m_atStart && !m_decoded && m_text.startsWith("\xEF\xBB\xBF"))
                m_text.remove(0, 3);
        }
        m_atStart = false;
        const bool end = block.isEmpty();
        // Whole lines only, so that a fault is placed on its line and no
        // character is cut in two.
        const qsizetype upTo = end ? m_text.size() : m_text.lastIndexOf('\n') + 1;
        parse(QByteArrayView(m_text).first(upTo), out);
        m_text.remove(0, upTo);
        if (end) {
            const int lastLine = m_any ? m_lastLine + 1 : 1;
            m_out = &out;
            if (csv_fini(&m_parser, onField, onRecord, this) != 0)
                throw QuotasError(invalidCsv(
                    m_fileName, QStringLiteral("um valor entre aspas começado na linha %1 não foi fechado.").arg(lastLine)));
            m_finished = true;
        }
        return true;
    }

    // Whether every byte read was UTF-8.
    bool validUtf8() const { return m_validUtf8; }

private:
    void parse(QByteArrayView text, std::deque<Record>& out)
    {
        if (m_validUtf8 && !m_utf16 && !text.isEmpty()) {
            QStringDecoder utf8(QStringDecoder::Utf8, QStringDecoder::Flag::Stateless);
            const QString decoded = utf8(text);  // decoded only to be checked
            m_validUtf8 = !utf8.hasError();
        }
        m_out = &out;
        // Fed a line at a time, so that a fault can be placed on its line.
        qsizetype at = 0;
        while (at < text.size()) {
            qsizetype end = text.indexOf('\n', at);
            end = end < 0 ? text.size() : end + 1;
            const size_t length = size_t(end - at);
            if (csv_parse(&m_parser, text.data() + at, length, onField, onRecord, this) != length) {
                if (csv_error(&m_parser) == CSV_EPARSE)
                    throw QuotasError(invalidCsv(m_fileName, QStringLiteral("há aspas fora do lugar na linha %1.").arg(m_line)));
                throw QuotasError(QStringLiteral("O ficheiro \"%1\" é demasiado grande para ser lido.").arg(m_fileName));
            }
            if (text[end - 1] == '\n')
                ++m_line;
            at = end;
        }
    }

    static void onField(void* data, size_t length, void* self)
    {
        auto* s = static_cast<Scanner*>(self);
        s->m_values << QByteArray(static_cast<const char*>(data), qsizetype(length));
    }
    static void onRecord(int, void* self)
    {
        auto* s = static_cast<Scanner*>(self);
        s->m_out->push_back(Record{std::move(s->m_values), s->m_line});
        s->m_values.clear();
        s->m_any = true;
        s->m_lastLine = s->m_line;
    }

    QIODevice& m_device;
    QString m_fileName;
    bool m_utf16;
    bool m_decoded;
    csv_parser m_parser{};
    QStringDecoder m_fromUtf16{QStringDecoder::Utf16};
    QByteArray m_text;  // read, not yet parsed
    bool m_atStart = true;
    bool m_finished = false;
    bool m_validUtf8 = true;
    int m_line = 1;
    bool m_any = false;
    int m_lastLine = 0;
    QList<QByteArray> m_values;
    std::deque<Record>* m_out = nullptr;
};

char detectDelimiter(const QString& headerLine)
{
    std::array<int, 3> counts{};  // ';', tab, ','
    bool quoted = false;
    for (const QChar c : headerLine) {
        if (c == u'"')
            quoted = !quoted;
        else if (!quoted && c == u';')
            ++counts[0];
        else if (!quoted && c == u'\t')
            ++counts[1];
        else if (!quoted && c == u',')
            ++counts[2];
    }
    static const char delimiters[] = {';', '\t', ','};
    int best = 0;
    for (int i = 1; i < 3; ++i) {
        if (counts[size_t(i)] > counts[size_t(best)])
            best = i;
    }
    return delimiters[best];
}

CsvLines::CsvLines(std::unique_ptr<QIODevice> device, QString fileName, bool decoded)
    : m_device(std::move(device)), m_fileName(std::move(fileName)), m_decoded(decoded)
{
}

CsvLines::~CsvLines() = default;

std::unique_ptr<CsvLines> CsvLines::open(const QString& path)
{
    const QFileInfo info(path);
    if (!info.exists())
        throw QuotasError(QStringLiteral("O ficheiro \"%1\" não existe.").arg(path));
    if (info.isDir())
        throw QuotasError(QStringLiteral("\"%1\" é uma pasta e não um ficheiro.").arg(path));
    auto file = std::make_unique<QFile>(path);
    if (!file->open(QIODevice::ReadOnly))
        throw QuotasError(QStringLiteral("Não foi possível abrir o ficheiro \"%1\" para leitura.").arg(path));
    std::unique_ptr<CsvLines> lines(new CsvLines(std::move(file), path, false));
    lines->check();
    return lines;
}

std::unique_ptr<CsvLines> CsvLines::fromText(const QString& text, const QString& fileName)
{
    auto buffer = std::make_unique<QBuffer>();
    buffer->setData(text.toUtf8());
    buffer->open(QIODevice::ReadOnly);
    std::unique_ptr<CsvLines> lines(new CsvLines(std::move(buffer), fileName, true));
    lines->check();
    return lines;
}

// The first pass: the encoding, the delimiter, the header, the count of the
// lines and every fault, holding a block at a time.
void CsvLines::check()
{
    // The delimiter is judged from the first line; the characters it counts
    // are the same bytes in UTF-8 and in the code page.
    const QByteArray start = m_device->peek(2);
    m_utf16 = !m_decoded && startsUtf16(start);
    // A file of text has no NUL byte, UTF-16 apart; that is checked before
    // anything else.
    const bool mayHaveNul = !m_decoded && !m_utf16;
    QString firstLine;
    bool firstLineRead = false;
    {
        QStringDecoder fromUtf16(QStringDecoder::Utf16);
        while (!m_device->atEnd() && (mayHaveNul || !firstLineRead)) {
            const QByteArray block = m_device->read(kBlock);
            if (mayHaveNul && block.contains('\0'))
                throw QuotasError(notText(m_fileName));
            if (firstLineRead)
                continue;
            firstLine += m_utf16 ? QString(fromUtf16(block)) : QString::fromLatin1(block);
            const qsizetype lineBreak = firstLine.indexOf(u'\n');
            const qsizetype cr = firstLine.indexOf(u'\r');
            if (lineBreak >= 0 || cr >= 0) {
                firstLine.truncate(lineBreak < 0 ? cr : cr < 0 ? lineBreak
                                                               : std::min(lineBreak, cr));
                firstLineRead = true;
            }
        }
    }
    m_delimiter = detectDelimiter(firstLine);

    Scanner scanner(*m_device, m_fileName, m_delimiter, m_utf16, m_decoded);
    std::deque<Record> records;
    QList<QByteArray> header;
    bool hasHeader = false;
    QString tooWide;  // the first line with more values than names, told once the whole file parses
    while (scanner.readBlock(records)) {
        for (Record& record : records) {
            if (!hasHeader) {
                header = std::move(record.values);
                hasHeader = true;
                continue;
            }
            if (std::all_of(record.values.cbegin(), record.values.cend(), [](const QByteArray& v) { return v.isEmpty(); }))
                continue;  // a blank line, or a spreadsheet's ";;;;"
            for (qsizetype i = header.size(); i < record.values.size() && tooWide.isEmpty(); ++i) {
                // A delimiter left at the end of a line adds only empty values.
                if (!record.values[i].isEmpty())
                    tooWide = invalidCsv(m_fileName, QStringLiteral("a linha %1 tem %2 valores, mais do que os %3 nomes de "
                                                                    "colunas da primeira linha.")
                                                         .arg(record.line)
                                                         .arg(record.values.size())
                                                         .arg(header.size()));
            }
            ++m_lineCount;
        }
        records.clear();
    }
    if (!tooWide.isEmpty())
        throw QuotasError(tooWide);
    m_windows1252 = !m_decoded && !m_utf16 && !scanner.validUtf8();
    for (const QByteArray& name : header)
        m_header << decoded(name);
}

QString CsvLines::decoded(const QByteArray& value) const
{
    if (value.isEmpty())
        return QStringLiteral("");  // an empty value is empty text, not Null
    if (m_windows1252)
        return fromWindows1252(value);
    // Only the file's first bytes can be a byte order mark (taken off when
    // it was read); a U+FEFF opening a value is part of it.
    QStringDecoder utf8(QStringDecoder::Utf8, QStringDecoder::Flag::Stateless | QStringDecoder::Flag::ConvertInitialBom);
    return utf8(value);
}

bool CsvLines::next(QStringList& line)
{
    if (!m_scanner)
        m_scanner = std::make_unique<Scanner>(*m_device, m_fileName, m_delimiter, m_utf16, m_decoded);
    for (;;) {
        while (m_pending.empty()) {
            if (!m_scanner->readBlock(m_pending))
                return false;
        }
        Record record = std::move(m_pending.front());
        m_pending.pop_front();
        if (!m_pastHeader) {
            m_pastHeader = true;
            continue;
        }
        if (std::all_of(record.values.cbegin(), record.values.cend(), [](const QByteArray& v) { return v.isEmpty(); }))
            continue;
        line.clear();
        const qsizetype n = std::min(record.values.size(), m_header.size());
        for (qsizetype i = 0; i < n; ++i)
            line << decoded(record.values[i]);
        return true;
    }
}

namespace {

CsvTable wholeTable(CsvLines& lines)
{
    CsvTable table{lines.header(), {}, lines.delimiter()};
    QStringList line;
    while (lines.next(line))
        table.rows << line;
    return table;
}

}  // namespace

CsvTable parseCsv(const QString& text, const QString& fileName)
{
    return wholeTable(*CsvLines::fromText(text, fileName));
}

CsvTable readCsvFile(const QString& path)
{
    return wholeTable(*CsvLines::open(path));
}

}  // namespace quotas
