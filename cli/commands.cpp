#include "cli/commands.h"

namespace quotas::cli {

// A new command or option gets its entry here and nowhere else: the parser,
// the help and the manual page all read this table.
const std::vector<Command>& commands()
{
    static const std::vector<Command> table = {
        {
            .name = "config",
            .run = config,
            .summary = "grava a configuração da ligação à base de dados",
            .description = "Grava as cinco definições da ligação no ficheiro de configuração (criando a pasta, "
                           "com o modo 0600) e mantém as outras chaves que ele tenha. A origem dos dados é um "
                           "ficheiro SQLite (um caminho) ou um servidor PostgreSQL (\"máquina\" ou \"máquina,porta\").",
            .options = {
                {"data-source", "DS", "Origem dos dados: ficheiro SQLite ou servidor PostgreSQL.", true},
                {"catalog", "NOME", "Base de dados no servidor."},
                {"user", "U", "Utilizador da base de dados."},
                {"password", "P", "Palavra-passe do utilizador."},
                {"security-info", "TEXTO", "Valor de Persist Security Info (por omissão False)."},
            },
        },
        {
            .name = "init-db",
            .run = initDb,
            .summary = "cria as tabelas que faltam na base de dados",
            .description = "Cria as tabelas que faltam onde a configuração aponta (um ficheiro SQLite é criado se "
                           "não existir; num servidor a base de dados tem de existir) e, com --demo, junta "
                           "associados de demonstração.",
            .options = {
                {"demo", "N", "Junta N associados de demonstração."},
            },
        },
        {
            .name = "login",
            .run = login,
            .summary = "verifica a ligação à base de dados",
            .description = "Lê a configuração e liga-se à base de dados, como faz o programa anfitrião antes de tudo.",
            .options = {
                {"print-connection-string", nullptr, "Mostra o texto de ligação em vez da confirmação."},
            },
        },
        {
            .name = "gerar",
            .run = gerar,
            .summary = "gera as quotas de um mês",
            .description = "Lança as quotas do mês a cada associado (ou só a um, com --no-tap). Correr o mesmo mês "
                           "outra vez lança só o que falta.",
            .options = {
                {"ano", "A", "Ano de processamento.", true},
                {"mes", "M", "Mês de processamento (1 a 12).", true},
                {"no-tap", "N", "Só o associado com este Número de Empresa."},
            },
        },
        {
            .name = "anular-geracao",
            .run = anularGeracao,
            .summary = "anula as quotas geradas num mês que ainda ninguém tocou",
            .description = "Mostra o plano das quotas do mês que seriam eliminadas; só com --confirmar as elimina, "
                           "associado a associado. Sai com 3 quando alguma quota foi alterada entretanto e ficou.",
            .options = {
                {"ano", "A", "Ano das quotas geradas.", true},
                {"mes", "M", "Mês das quotas geradas (1 a 12).", true},
                {"tipo", "1|2", "Só as quotas deste tipo (1 Sindicato, 2 Seguro)."},
                {"no-tap", "N", "Só o associado com este Número de Empresa."},
                {"confirmar", nullptr, "Elimina as quotas do plano (sem esta opção nada muda)."},
            },
        },
        {
            .name = "importar",
            .run = importar,
            .summary = "importa a lista de quotas descontadas pela empresa",
            .description = "Regista os descontos da lista da empresa contra as quotas lançadas no mês, ano e tipo "
                           "indicados. Os registos não importados ficam na tabela extras.",
            .options = {
                {"ano", "A", "Ano das quotas.", true},
                {"mes", "M", "Mês das quotas (1 a 12).", true},
                {"tipo", "1|2", "Tipo de quota: 1 Sindicato, 2 Seguro (Plano de Saúde).", true},
                {"sem-separador", nullptr, "Os valores estão em cêntimos, sem separador decimal."},
                {"pdf", "SAIDA", "Escreve neste ficheiro PDF a listagem dos registos não importados."},
                {"simular", nullptr, "Não grava nada: diz, linha a linha, o que a importação faria."},
            },
            .operand = "FICHEIRO",
            .operandText = "A lista da empresa: texto com os nomes das colunas na primeira linha.",
        },
        {
            .name = "manutencao",
            .run = manutencao,
            .summary = "repara os dados das quotas",
            .description = "Põe a 0 os valores nulos dos movimentos e refaz os totais das contas a partir dos "
                           "movimentos.",
            .options = {},
        },
        {
            .name = "copiar",
            .run = copiar,
            .summary = "copia a instalação em uso para uma base de dados PostgreSQL vazia",
            .description = "Copia todas as tabelas da base de dados em uso para uma base de dados vazia num servidor "
                           "PostgreSQL, verifica-as tabela a tabela e cria os índices, como \"quotas init-db\". A configuração continua a apontar para onde "
                           "apontava; no fim é mostrado o comando \"quotas config\" que passa a usar o servidor.",
            .options = {
                {"data-source", "HOST[,PORTA]", "Servidor de destino, HOST ou HOST,PORTA.", true},
                {"catalog", "BD", "Base de dados de destino (vazia).", true},
                {"user", "U", "Utilizador.", true},
                {"password", "P", "Palavra-passe.", true},
            },
        },
        {
            .name = "listagem",
            .run = listagem,
            .summary = "escreve a listagem de dívidas em PDF",
            .description = "Escreve em PDF a Listagem de Quotas em Dívida por Associado.",
            .options = {
                {"pdf", "SAIDA", "Ficheiro PDF a escrever.", true},
            },
        },
        {
            .name = "cartas",
            .run = cartas,
            .summary = "escreve as cartas de dívidas em PDF",
            .description = "Escreve em PDF uma carta por associado em dívida, com o cabeçalho do ficheiro "
                           "letterhead.txt.",
            .options = {
                {"pdf", "SAIDA", "Ficheiro PDF a escrever.", true},
            },
        },
        {
            .name = "rejeitados",
            .run = rejeitados,
            .summary = "escreve em PDF a listagem dos registos não importados",
            .description = "Escreve em PDF a listagem dos registos da última importação que ficaram na tabela "
                           "extras.",
            .options = {
                {"pdf", "SAIDA", "Ficheiro PDF a escrever.", true},
            },
        },
        {
            .name = "extrato",
            .run = extrato,
            .summary = "escreve em PDF o extrato de quotas de um associado",
            .description = "Escreve em PDF o extrato de quotas de um associado: um movimento por linha, por ano, mês "
                           "e tipo, com o valor, o pago, o que está por liquidar e o saldo em dívida acumulado.",
            .options = {
                {"no-tap", "N", "Número de Empresa do associado.", true},
                {"desde", "AAAA-MM", "Primeiro mês do extrato."},
                {"ate", "AAAA-MM", "Último mês do extrato."},
                {"todos-os-movimentos", nullptr, "Também os movimentos inactivos e do histórico."},
                {"pdf", "SAIDA", "Escreve as páginas neste ficheiro PDF.", true},
            },
        },
        {
            .name = "resumo",
            .run = resumo,
            .summary = "escreve o resumo de um mês em PDF ou CSV",
            .description = "Escreve o resumo das quotas do mês por tipo e no total (associados, quotas, descontado pela "
                           "empresa, pago de outra forma e por liquidar) em PDF, em CSV ou em ambos.",
            .options = {
                {"ano", "A", "Ano do resumo.", true},
                {"mes", "M", "Mês do resumo (1 a 12).", true},
                {"pdf", "SAIDA", "Escreve a página neste ficheiro PDF."},
                {"csv", "SAIDA", "Escreve os valores neste ficheiro CSV."},
            },
        },
    };
    return table;
}

const Command* findCommand(const QString& name)
{
    for (const Command& command : commands())
        if (name == QLatin1String(command.name))
            return &command;
    return nullptr;
}

}  // namespace quotas::cli
