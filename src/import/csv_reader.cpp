#include "import/csv_reader.h"

#include "import/text_encoding.h"
#include "platform/errors.h"

#include <QFile>
#include <QFileInfo>
#include <QStringDecoder>
#include <algorithm>
#include <array>
#include <csv.h>

namespace quotas {

namespace {

struct ParseState {
    QStringList fields;
    QList<QStringList> records;
    QList<int> recordLines;  // the line each record ended on
    int line = 1;
};

void onField(void* data, size_t length, void* state)
{
    auto* s = static_cast<ParseState*>(state);
    // Only the file's first bytes can be a byte order mark (taken off when
    // it was decoded); a U+FEFF opening a value is part of it.
    QStringDecoder utf8(QStringDecoder::Utf8, QStringDecoder::Flag::Stateless | QStringDecoder::Flag::ConvertInitialBom);
    QString value = utf8(QByteArrayView(static_cast<const char*>(data), qsizetype(length)));
    if (value.isNull())
        value = QStringLiteral("");  // an empty value is empty text, not Null
    s->fields << value;
}

void onRecord(int, void* state)
{
    auto* s = static_cast<ParseState*>(state);
    s->records << s->fields;
    s->recordLines << s->line;
    s->fields.clear();
}

int spaceOnly(unsigned char c)
{
    return c == ' ' ? 1 : 0;
}

// Owns a libcsv parser for the length of one parse.
class Parser {
public:
    explicit Parser(char delimiter)
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
    }
    ~Parser() { csv_free(&m_parser); }
    Parser(const Parser&) = delete;
    Parser& operator=(const Parser&) = delete;
    csv_parser* get() { return &m_parser; }

private:
    csv_parser m_parser{};
};

QString invalidCsv(const QString& fileName, const QString& reason)
{
    return QStringLiteral("O ficheiro \"%1\" não é um ficheiro CSV válido: %2").arg(fileName, reason);
}

}  // namespace

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

CsvTable parseCsv(const QString& text, const QString& fileName)
{
    CsvTable table;
    qsizetype firstBreak = text.indexOf(u'\n');
    const qsizetype cr = text.indexOf(u'\r');
    if (cr >= 0 && (firstBreak < 0 || cr < firstBreak))
        firstBreak = cr;
    table.delimiter = detectDelimiter(firstBreak < 0 ? text : text.left(firstBreak));

    const QByteArray bytes = text.toUtf8();
    Parser parser(table.delimiter);
    ParseState state;
    // Fed a line at a time, so that a fault can be placed on its line.
    qsizetype at = 0;
    while (at < bytes.size()) {
        qsizetype end = bytes.indexOf('\n', at);
        end = end < 0 ? bytes.size() : end + 1;
        const size_t length = size_t(end - at);
        if (csv_parse(parser.get(), bytes.constData() + at, length, onField, onRecord, &state) != length) {
            if (csv_error(parser.get()) == CSV_EPARSE)
                throw QuotasError(invalidCsv(fileName, QStringLiteral("há aspas fora do lugar na linha %1.").arg(state.line)));
            throw QuotasError(QStringLiteral("O ficheiro \"%1\" é demasiado grande para ser lido.").arg(fileName));
        }
        if (bytes[end - 1] == '\n')
            ++state.line;
        at = end;
    }
    const int lastLine = state.recordLines.isEmpty() ? 1 : state.recordLines.constLast() + 1;
    if (csv_fini(parser.get(), onField, onRecord, &state) != 0)
        throw QuotasError(invalidCsv(
            fileName, QStringLiteral("um valor entre aspas começado na linha %1 não foi fechado.").arg(lastLine)));

    if (state.records.isEmpty())
        return table;
    table.header = state.records.front();
    const qsizetype width = table.header.size();
    table.rows.reserve(state.records.size() - 1);
    for (qsizetype r = 1; r < state.records.size(); ++r) {
        QStringList& row = state.records[r];
        // Spreadsheet programs write a blank row as ";;;;": a blank line.
        if (std::all_of(row.cbegin(), row.cend(), [](const QString& value) { return value.isEmpty(); }))
            continue;
        if (row.size() > width) {
            // A delimiter left at the end of a line adds only empty values.
            for (qsizetype i = width; i < row.size(); ++i) {
                if (!row[i].isEmpty())
                    throw QuotasError(invalidCsv(fileName, QStringLiteral("a linha %1 tem %2 valores, mais do que os %3 "
                                                                          "nomes de colunas da primeira linha.")
                                                               .arg(state.recordLines[r])
                                                               .arg(row.size())
                                                               .arg(width)));
            }
            row.resize(width);
        }
        table.rows << std::move(row);
    }
    return table;
}

CsvTable readCsvFile(const QString& path)
{
    const QFileInfo info(path);
    if (!info.exists())
        throw QuotasError(QStringLiteral("O ficheiro \"%1\" não existe.").arg(path));
    if (info.isDir())
        throw QuotasError(QStringLiteral("\"%1\" é uma pasta e não um ficheiro.").arg(path));
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly))
        throw QuotasError(QStringLiteral("Não foi possível abrir o ficheiro \"%1\" para leitura.").arg(path));
    const QByteArray bytes = file.readAll();
    if (file.error() != QFileDevice::NoError)
        throw QuotasError(QStringLiteral("Não foi possível ler o ficheiro \"%1\".").arg(path));
    const bool utf16 = bytes.startsWith("\xFF\xFE") || bytes.startsWith("\xFE\xFF");
    if (!utf16 && bytes.contains('\0'))
        throw QuotasError(QStringLiteral("O ficheiro \"%1\" não é um ficheiro de texto CSV.").arg(path));
    return parseCsv(decodeImportText(bytes), path);
}

}  // namespace quotas
