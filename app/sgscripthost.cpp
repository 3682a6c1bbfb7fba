#include "app/sgscripthost.h"

#include "app/sgmodalanswerer.h"
#include "app/sgpluginhost.h"
#include "app/sgscriptapi.h"
#include "app/sgscriptrunner.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"

#include <cstdio>

SgScriptHost::SgScriptHost(const SgPluginHost *plugins, const QStringList &scriptArguments,
                           QObject *parent)
    : QObject(parent), m_runner(new SgScriptRunner(this)),
      m_answerer(new SgModalAnswerer(m_runner, this)),
      m_app(new SgScriptApp(m_runner, m_answerer, plugins, scriptArguments, this)),
      m_scene(new SgScriptScene(this)), m_selection(new SgScriptSelection(this)) {
    m_runner->addGlobal(QStringLiteral("app"), m_app);
    m_runner->addGlobal(QStringLiteral("scene"), m_scene);
    m_runner->addGlobal(QStringLiteral("selection"), m_selection);
    plugins->registerClasses(m_runner->engine());

    SgMessageSink *sink = sgApp->getMessageSink();
    connect(sink, &SgMessageSink::logged, this, [](const QString &text) {
        std::printf("%s\n", qPrintable(text));
        std::fflush(stdout);
    });
    connect(sink, &SgMessageSink::statusChanged, this, [](const QString &text, bool) {
        std::printf("Status: %s\n", qPrintable(text));
        std::fflush(stdout);
    });
}

SgScriptHost::~SgScriptHost() = default;

int SgScriptHost::run(const QString &path) {
    m_answerer->setWatching(true);
    const int status = m_runner->run(path);
    m_answerer->setWatching(false);
    return status;
}
