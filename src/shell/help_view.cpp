#include "shell/help_view.h"

#include <QFile>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QTextBrowser>
#include <QVBoxLayout>

namespace {
const QString kBook = QStringLiteral("qrc:/help/");

struct TopicList {
    QStringList order;
    QHash<QString, QString> pages;
};

const TopicList& topicList()
{
    static const TopicList list = [] {
        TopicList t;
        QFile f(QStringLiteral(":/help/topics.txt"));
        if (!f.open(QIODevice::ReadOnly | QIODevice::Text))
            return t;
        const QStringList lines = QString::fromUtf8(f.readAll()).split(QLatin1Char('\n'));
        for (const QString& line : lines) {
            const QStringList parts = line.split(QLatin1Char('\t'));
            if (parts.size() != 2 || parts[0].trimmed().isEmpty())
                continue;
            t.order << parts[0].trimmed();
            t.pages.insert(parts[0].trimmed(), parts[1].trimmed());
        }
        return t;
    }();
    return list;
}
} // namespace

const QHash<QString, QString>& HelpView::topicPages()
{
    return topicList().pages;
}

QStringList HelpView::topics()
{
    return topicList().order;
}

QString HelpView::pageForTopic(const QString& topic)
{
    return topicPages().value(topic.trimmed());
}

HelpView::HelpView(QWidget* parent) : QWidget(parent, Qt::Window)
{
    setObjectName(QStringLiteral("HelpWindow"));
    setWindowTitle(tr("Glacinor Help"));
    auto* layout = new QVBoxLayout(this);
    auto* bar = new QHBoxLayout;
    auto* contents = new QPushButton(tr("&Contents"), this);
    auto* back = new QPushButton(tr("&Back"), this);
    auto* forward = new QPushButton(tr("&Forward"), this);
    back->setEnabled(false);
    forward->setEnabled(false);
    bar->addWidget(contents);
    bar->addWidget(back);
    bar->addWidget(forward);
    bar->addStretch();
    layout->addLayout(bar);

    m_notice = new QLabel(this);
    m_notice->setVisible(false);
    m_notice->setWordWrap(true);
    layout->addWidget(m_notice);

    m_browser = new QTextBrowser(this);
    m_browser->setObjectName(QStringLiteral("helpBrowser"));
    m_browser->setOpenExternalLinks(true);
    layout->addWidget(m_browser, 1);

    connect(contents, &QPushButton::clicked, this, [this] { show_help(QStringLiteral("q-19.chm")); });
    connect(back, &QPushButton::clicked, m_browser, &QTextBrowser::backward);
    connect(forward, &QPushButton::clicked, m_browser, &QTextBrowser::forward);
    connect(m_browser, &QTextBrowser::backwardAvailable, back, &QPushButton::setEnabled);
    connect(m_browser, &QTextBrowser::forwardAvailable, forward, &QPushButton::setEnabled);
    resize(760, 600);
}

void HelpView::show_help(const QString& file, const QString& topic)
{
    Q_UNUSED(file); // every help file name opens the one book
    QString page = QStringLiteral("index.html");
    m_notice->setVisible(false);
    if (!topic.isEmpty()) {
        const QString found = pageForTopic(topic);
        if (found.isEmpty()) {
            m_notice->setText(tr("There is no help page for \"%1\"; here are the contents.").arg(topic));
            m_notice->setVisible(true);
        } else {
            page = found;
        }
    }
    m_browser->setSource(QUrl(kBook + page));
    show();
    raise();
    activateWindow();
}
