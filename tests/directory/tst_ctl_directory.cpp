#include <QtTest>

// q19ctl directory, run as a user runs it: one data folder through a
// sequence of commands, each with its exit code and what it prints.
class TestCtlDirectory : public QObject {
    Q_OBJECT
private slots:
    void commandsInSequence_data();
    void commandsInSequence();

private:
    QTemporaryDir m_folder;
};

void TestCtlDirectory::commandsInSequence_data()
{
    QTest::addColumn<QStringList>("args");
    QTest::addColumn<int>("exitCode");
    QTest::addColumn<QString>("stdoutText");
    QTest::addColumn<QString>("stderrLast");
    QTest::newRow("first list") << QStringList{"list"} << 0 << "1\tDemo Cold Store\t\t\t\t\n" << "";
    QTest::newRow("add") << QStringList{"add", "12", "North", "--modem-phone", "5550112"} << 0 << ""
                         << "Mandatory: You must press either";
    QTest::newRow("add duplicate") << QStringList{"add", "12", "South"} << 1 << ""
                                   << "Duplicate ID Number: You have entered";
    QTest::newRow("add crafted id") << QStringList{"add", "../x", "Bad"} << 1 << "" << "Q-19: Unexpected Error:";
    QTest::newRow("compact") << QStringList{"compact", "12"} << 0 << ""
                             << "Done Compact: Name = North / Glacinor ID No. = 12";
    QTest::newRow("delete unconfirmed") << QStringList{"delete", "12"} << 1 << "" << "q19ctl directory: not confirmed";
    QTest::newRow("list after") << QStringList{"list"} << 0 << "1\tDemo Cold Store\t\t\t\t\n12\tNorth\t\t\t\t5550112\n"
                                << "";
    QTest::newRow("delete") << QStringList{"delete", "12", "--yes"} << 0 << "" << "Delete Glacinor: Are you sure";
    QTest::newRow("delete last") << QStringList{"delete", "1", "--yes"} << 1 << ""
                                 << "Can't Delete: There is only one record left,";
    QTest::newRow("unknown id") << QStringList{"compact", "99"} << 1 << "" << "there is no Glacinor with ID 99";
    QTest::newRow("usage") << QStringList{"add", "5"} << 2 << "" << "Run \"q19ctl directory --help\"";
}

void TestCtlDirectory::commandsInSequence()
{
    QFETCH(QStringList, args);
    QFETCH(int, exitCode);
    QFETCH(QString, stdoutText);
    QFETCH(QString, stderrLast);
    QProcess ctl;
    ctl.start(QStringLiteral(Q19CTL_PATH), QStringList{"--data-dir", m_folder.path(), "directory"} + args);
    QVERIFY(ctl.waitForFinished(60000));
    const QString err = QString::fromLocal8Bit(ctl.readAllStandardError()).trimmed();
    QCOMPARE(ctl.exitCode(), exitCode);
    QCOMPARE(QString::fromLocal8Bit(ctl.readAllStandardOutput()), stdoutText);
    const QString last = err.section('\n', -1);
    QVERIFY2(stderrLast.isEmpty() ? err.isEmpty() : last.contains(stderrLast), qPrintable(err));
}

QTEST_GUILESS_MAIN(TestCtlDirectory)
#include "tst_ctl_directory.moc"
