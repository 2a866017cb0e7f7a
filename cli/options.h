#pragma once

#include <QCommandLineParser>
#include <QStringList>

namespace quotas::cli {

// A command's options as its entry in the command table lists them, parsed
// strictly: an unknown option, a missing value or a missing file is a
// UsageError.
class Options {
public:
    Options(const QString& command, const QStringList& args);

    bool isSet(const QString& name) const { return m_parser.isSet(name); }
    QString value(const QString& name) const { return m_parser.value(name); }
    // A required whole number within [low, high].
    int number(const QString& name, int low, int high) const;
    QStringList positional() const { return m_parser.positionalArguments(); }

private:
    QString m_command;
    QCommandLineParser m_parser;
};

}  // namespace quotas::cli
