#pragma once

#include "platform/errors.h"

#include <QStringList>
#include <vector>

namespace quotas::cli {

// A usage or settings problem: exit status 2.
class UsageError : public QuotasError {
public:
    using QuotasError::QuotasError;
};

// The exit statuses: 0 done; kLeftOut done with something left out (the
// count on stdout); 1 failed (the reason on stderr); 2 usage or settings.
constexpr int kLeftOut = 3;

// One option of a command: its long name, the name of its value (none for a
// switch) and one line of help. A required option is shown without brackets.
struct OptionHelp {
    const char* name;
    const char* value;
    const char* text;
    bool required = false;
};

// One command of the command line. The table of them is the one source of
// the dispatch, the parsing of options, "quotas COMMAND --help" and the manual.
struct Command {
    const char* name;
    int (*run)(const QStringList& args);
    const char* summary;      // one line in "quotas --help"
    const char* description;  // the paragraph of "quotas COMMAND --help" and the manual
    std::vector<OptionHelp> options;
    const char* operand = nullptr;  // a file named after the options, if the command takes one
    const char* operandText = nullptr;
};

// Every command, in the order of the help.
const std::vector<Command>& commands();
const Command* findCommand(const QString& name);

// Each command takes the arguments after its name and returns the exit status.
int config(const QStringList& args);
int initDb(const QStringList& args);
int login(const QStringList& args);
int gerar(const QStringList& args);
int anularGeracao(const QStringList& args);
int copiar(const QStringList& args);
int importar(const QStringList& args);
int manutencao(const QStringList& args);
int listagem(const QStringList& args);
int cartas(const QStringList& args);
int rejeitados(const QStringList& args);
int extrato(const QStringList& args);
int resumo(const QStringList& args);

// Runs Login on the shared data environment; a missing setting is a
// UsageError naming it.
void connectOrFail();
// Throws the UsageError for a setting the reader did not find: the file and
// line that could not be read when the file is malformed, else the setting.
[[noreturn]] void missingSetting(const QString& name);

}  // namespace quotas::cli
