// q19ctl identify: connect as the instrument's stored settings say, check its
// identity and print what it reports.

#include "ctl/ctl_command.h"
#include "ctl/ctl_connect.h"

#include <QJsonDocument>
#include <QJsonObject>
#include <cstdio>

namespace {

int identify(const CtlOptions& o)
{
    if (!o.args.isEmpty()) {
        std::fprintf(stderr, "q19ctl: identify takes no arguments\n");
        return ctl::Usage;
    }
    ctl::Connection connection(o);
    const int rc = connection.open(QStringLiteral("identify"));
    // What the instrument said is printed even when a message followed it.
    if (connection.accepted()) {
        ccForm1_engine& engine = connection.engine();
        const QString version = engine.version.text.trimmed();
        const QString resets = engine.resets.text.trimmed();
        const QString time = engine.time.text.trimmed();
        const QString id = connection.id();
        QString out;
        if (o.json) {
            QJsonObject j{{"version", version}, {"id", id}, {"resets", resets}, {"time", time}};
            out = QString::fromUtf8(QJsonDocument(j).toJson(QJsonDocument::Compact)) + '\n';
        } else {
            out = QStringLiteral("version: %1\nid: %2\nresets: %3\ntime: %4\n").arg(version, id, resets, time);
        }
        std::fputs(out.toLocal8Bit().constData(), stdout);
        std::fflush(stdout);
    }
    return rc;
}

const ctl::Registration registration({QStringLiteral("identify"), QString(),
                                       QStringLiteral("connect, check the identity and print version, "
                                                      "ID, resets and the instrument's time"),
                                       identify});

} // namespace
