#include "settings/registry_reader.h"

#include "platform/errors.h"
#include "platform/message_boxes.h"
#include "settings/code_page.h"
#include "settings/registry_file.h"
#include "settings/settings_location.h"

#include <optional>

namespace quotas::registry {

namespace {

struct Root {
    const char* name;
    quint32 handle;
};

constexpr Root kRoots[] = {
    {"HKEY_CLASSES_ROOT", HKEY_CLASSES_ROOT},
    {"HKEY_CURRENT_USER", HKEY_CURRENT_USER},
    {"HKEY_LOCAL_MACHINE", HKEY_LOCAL_MACHINE},
    {"HKEY_USERS", HKEY_USERS},
    {"HKEY_PERFORMANCE_DATA", HKEY_PERFORMANCE_DATA},
    {"HKEY_CURRENT_CONFIG", HKEY_CURRENT_CONFIG},
    {"HKEY_DYN_DATA", HKEY_DYN_DATA},
};

// The read buffer holds 255 bytes, terminator included.
constexpr qsizetype kBufferSize = 255;

// Module state shared by the three operations, as the reader always kept it.
struct State {
    quint32 root = 0;
    std::optional<RegistryFile> openedKeyFile;
    QString buffer;
    qsizetype length = 0;
};

thread_local State state;

QString rootName(quint32 handle)
{
    for (const Root& r : kRoots) {
        if (r.handle == handle)
            return QString::fromLatin1(r.name);
    }
    return QString();
}

QString fullKey(quint32 root, const QString& subKey)
{
    return subKey.isEmpty() ? rootName(root) : rootName(root) + u'\\' + subKey;
}

// Opening a key: the settings file must be readable and name the key.
bool openKey(quint32 root, const QString& subKey)
{
    state.openedKeyFile.reset();
    try {
        RegistryFile file = RegistryFile::load(registryPath());
        if (!file.hasKey(fullKey(root, subKey)))
            return false;
        state.openedKeyFile = std::move(file);
        return true;
    } catch (const QuotasError&) {
        return false;
    }
}

void closeKey()
{
    state.openedKeyFile.reset();
}

}  // namespace

quint32 RootKeyHandle(const QString& name)
{
    for (const Root& r : kRoots) {
        if (name == QLatin1String(r.name))
            return r.handle;
    }
    return 0;
}

void ParseKeyPath(QString& keyPath, quint32& root)
{
    const qsizetype slash = keyPath.indexOf(u'\\') + 1;  // 1-based, 0 when none
    if (!keyPath.startsWith(QStringLiteral("HKEY_"), Qt::CaseSensitive) || keyPath.endsWith(u'\\')) {
        msgBox(QStringLiteral("Formato Incorrecto:\n\n") + keyPath, Buttons::Ok, Icon::None);
        root = 0;
        return;
    }
    if (slash > 0) {
        root = RootKeyHandle(keyPath.left(slash - 1));
        keyPath = keyPath.mid(slash);
    } else {
        root = RootKeyHandle(keyPath);
        keyPath.clear();
    }
}

QVariant QueryValue(QString& keyPath, QString& valueName)
{
    ParseKeyPath(keyPath, state.root);
    if (state.root == 0)
        return QVariant();
    if (!openKey(state.root, keyPath))
        return nullMarker();
    state.buffer = QString(kBufferSize, u' ');
    state.length = kBufferSize;
    const std::optional<QByteArray> data = state.openedKeyFile->data(fullKey(state.root, keyPath), valueName);
    if (!data || data->size() > kBufferSize) {
        closeKey();
        return nullMarker();
    }
    state.buffer = fromCodePage1252(*data) + state.buffer.mid(data->size());
    state.length = data->size();
    closeKey();
    // Trimmed while the terminator is still the last character: leading
    // spaces go, trailing spaces stay; then the terminator is dropped.
    QString text = state.buffer.left(state.length);
    qsizetype start = 0;
    while (start < text.size() && text[start] == u' ')
        ++start;
    qsizetype end = text.size();
    while (end > start && text[end - 1] == u' ')
        --end;
    text = text.mid(start, end - start);
    text.chop(1);
    return text;
}

QVariant nullMarker()
{
    return QVariant::fromValue(nullptr);
}

bool isNullMarker(const QVariant& value)
{
    return value.isValid() && value.isNull();
}

bool isEmptyVariant(const QVariant& value)
{
    return !value.isValid();
}

}  // namespace quotas::registry
