#include "sgcore/script/sgscript.h"

#include "sgcore/script/sgscriptsceneapi.h"

#include <QFile>
#include <QFileInfo>
#include <QJSEngine>

const QString SgScript::s_VarnScriptBinaryExtension = QStringLiteral("sgb");
const QString SgScript::s_VarnScriptEncryptedBinaryExtension = QStringLiteral("sge");
const QString SgScript::s_VarnScript1TextExtension = QStringLiteral("sgs");
const QString SgScript::s_VarnScript2TextExtension = QStringLiteral("js");

namespace {
constexpr qint64 kMaxScriptBytes = 16 * 1024 * 1024;

QString describeError(const QJSValue &error, const QString &origin) {
    const int line = error.property(QStringLiteral("lineNumber")).toInt();
    return QStringLiteral("Script error in %1 line %2: %3")
        .arg(origin)
        .arg(line)
        .arg(error.toString());
}
} // namespace

SgScript::SgScript() = default;

SgScript::~SgScript() = default;

bool SgScript::isScriptFile(const QString &path) {
    const QString suffix = QFileInfo(path).suffix();
    for (const QString *ext : {&s_VarnScriptBinaryExtension, &s_VarnScriptEncryptedBinaryExtension,
                               &s_VarnScript1TextExtension, &s_VarnScript2TextExtension}) {
        if (suffix.compare(*ext, Qt::CaseInsensitive) == 0)
            return true;
    }
    return false;
}

void SgScript::setSource(const QString &source, const QString &origin) {
    m_source = source;
    m_fileName = origin;
    m_error.clear();
    m_loaded = true;
}

bool SgScript::loadFromFile(const QString &path, bool checkSyntax) {
    m_source.clear();
    m_fileName = path;
    m_loaded = false;
    m_error.clear();

    const QString suffix = QFileInfo(path).suffix();
    if (suffix.compare(s_VarnScriptBinaryExtension, Qt::CaseInsensitive) == 0 ||
        suffix.compare(s_VarnScriptEncryptedBinaryExtension, Qt::CaseInsensitive) == 0) {
        m_error = QStringLiteral("Compiled scripts are not supported: %1").arg(path);
        return false;
    }
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        m_error = QStringLiteral("Cannot open script file %1: %2").arg(path, file.errorString());
        return false;
    }
    if (file.size() > kMaxScriptBytes) {
        m_error = QStringLiteral("Script file %1 is too big").arg(path);
        return false;
    }
    const QByteArray bytes = file.read(kMaxScriptBytes + 1);
    if (bytes.size() > kMaxScriptBytes) {
        m_error = QStringLiteral("Script file %1 is too big").arg(path);
        return false;
    }
    const QString source = QString::fromUtf8(bytes);

    if (checkSyntax) {
        // Compiling the text into a function body parses it without running any of it.
        QJSEngine engine;
        const QJSValue function =
            engine.globalObject().property(QStringLiteral("Function")).callAsConstructor({source});
        if (function.isError()) {
            m_error = describeError(function, path);
            return false;
        }
    }
    m_source = source;
    m_loaded = true;
    return true;
}

bool SgScript::execute() {
    if (!m_loaded) {
        if (m_error.isEmpty())
            m_error = QStringLiteral("No script loaded");
        return false;
    }
    SgScriptSceneApi api;
    QJSEngine::setObjectOwnership(&api, QJSEngine::CppOwnership);
    QJSEngine engine;
    const QJSValue apiValue = engine.newQObject(&api);
    engine.globalObject().setProperty(QStringLiteral("scene"), apiValue);
    const QJSValue makePrint = engine.evaluate(
        QStringLiteral("(function (api) { return function () {"
                       " api.print(Array.prototype.map.call(arguments, String).join(' ')); }; })"));
    engine.globalObject().setProperty(QStringLiteral("print"), makePrint.call({apiValue}));
    const QJSValue result = engine.evaluate(m_source, m_fileName);
    if (result.isError()) {
        m_error = describeError(result, m_fileName);
        SgScriptSceneApi::log(m_error);
        return false;
    }
    m_error.clear();
    return true;
}
