#include "platform/portuguese.h"

#include <QCoreApplication>
#include <QHash>
#include <QLibraryInfo>
#include <QRegularExpression>
#include <QTranslator>
#include <utility>

namespace quotas {

namespace {

// Brazilian words of Qt's translation and their European equivalents, as
// whole words, with their capitalised and plural forms.
const std::pair<const char*, const char*> kEuropean[] = {
    {"arquivo", "ficheiro"},
    {"arquivos", "ficheiros"},
    {"salvar", "guardar"},
    {"excluir", "eliminar"},
    {"tela", "ecrã"},
    {"telas", "ecrãs"},
    {"usuário", "utilizador"},
    {"usuários", "utilizadores"},
    {"visualizar", "pré-visualizar"},
    {"visualização", "pré-visualização"},
    {"baixar", "transferir"},
    {"deletar", "eliminar"},
    {"registro", "registo"},
    {"registros", "registos"},
    {"contato", "contacto"},
};

// Qt's standard buttons, whatever the Brazilian file says of them.
const std::pair<const char*, const char*> kButtons[] = {
    {"&Yes", "&Sim"},
    {"&No", "&Não"},
    {"Cancel", "Cancelar"},
    {"&Cancel", "&Cancelar"},
    {"Yes to &All", "Sim para &todos"},
    {"N&o to All", "Não para t&odos"},
    {"Close", "Fechar"},
    {"&OK", "&OK"},
    {"Apply", "Aplicar"},
    {"&Save", "&Guardar"},
    {"Save", "Guardar"},
    {"Open", "Abrir"},
    {"&Open", "&Abrir"},
    {"Discard", "Descartar"},
    {"Help", "Ajuda"},
    {"Reset", "Repor"},
    {"Restore Defaults", "Repor predefinições"},
    {"Abort", "Abortar"},
    {"Retry", "Repetir"},
    {"Ignore", "Ignorar"},
};

QString european(const QString& text)
{
    static const auto [words, replacements] = [] {
        QStringList alternatives;
        QHash<QString, QString> map;
        for (const auto& [brazilian, ours] : kEuropean) {
            alternatives << QString::fromUtf8(brazilian);
            map.insert(QString::fromUtf8(brazilian), QString::fromUtf8(ours));
        }
        return std::pair{QRegularExpression(QStringLiteral("\\b(%1)\\b").arg(alternatives.join(u'|')),
                                            QRegularExpression::CaseInsensitiveOption
                                                | QRegularExpression::UseUnicodePropertiesOption),
                         map};
    }();
    QString out;
    qsizetype last = 0;
    for (auto it = words.globalMatch(text); it.hasNext();) {
        const QRegularExpressionMatch m = it.next();
        const QString word = m.captured(1);
        QString replacement = replacements.value(word.toLower());
        if (word.front().isUpper())
            replacement.front() = replacement.front().toUpper();
        out += QStringView(text).mid(last, m.capturedStart(1) - last);
        out += replacement;
        last = m.capturedEnd(1);
    }
    if (last == 0)
        return text;
    out += QStringView(text).mid(last);
    return out;
}

class EuropeanPortuguese final : public QTranslator {
public:
    QTranslator brazilian;

    bool isEmpty() const override { return false; }

    QString translate(const char* context, const char* source, const char* disambiguation, int n) const override
    {
        if (qstrcmp(context, "QPlatformTheme") == 0 || qstrcmp(context, "QDialogButtonBox") == 0) {
            for (const auto& [english, ours] : kButtons) {
                if (qstrcmp(source, english) == 0)
                    return QString::fromUtf8(ours);
            }
        }
        const QString text = brazilian.translate(context, source, disambiguation, n);
        return text.isEmpty() ? text : european(text);
    }
};

}  // namespace

bool installPortugueseTranslation(QCoreApplication& app)
{
    static EuropeanPortuguese translator;
    const bool found = translator.brazilian.load(QStringLiteral("qtbase_pt_BR"),
                                                 QLibraryInfo::path(QLibraryInfo::TranslationsPath));
    app.installTranslator(&translator);
    return found;
}

}  // namespace quotas
