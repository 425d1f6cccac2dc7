#pragma once

#include <QHash>
#include <QWidget>

class QTextBrowser;
class QLabel;

// The program's help: HTML pages shipped inside the program, one per topic,
// shown in a browser window with contents, back and forward.
class HelpView : public QWidget {
    Q_OBJECT
public:
    explicit HelpView(QWidget* parent = nullptr);

    // Opens the help book. With a topic, opens that topic's page; an unknown
    // topic opens the contents and says which topic was asked for. The file
    // names of the older help formats ("q-19.chm", "q-19.hlp") open the same
    // book.
    void show_help(const QString& file, const QString& topic = {});

    // The page of a topic, or empty when the book has no such topic.
    static QString pageForTopic(const QString& topic);
    // Every topic in the book's order.
    static QStringList topics();

    QTextBrowser* browser() const { return m_browser; }

private:
    static const QHash<QString, QString>& topicPages();
    QTextBrowser* m_browser;
    QLabel* m_notice;
};
