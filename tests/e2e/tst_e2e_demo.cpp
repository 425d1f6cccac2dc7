#include <QtTest>

// A fresh data folder holds the demo instrument, whose port is the built-in
// simulator; the headless program must reach it as the workstation does.
class TestE2eDemo : public QObject {
    Q_OBJECT
private slots:
    void freshFolderReachesTheBuiltInSimulator_data();
    void freshFolderReachesTheBuiltInSimulator();
};

void TestE2eDemo::freshFolderReachesTheBuiltInSimulator_data()
{
    QTest::addColumn<QStringList>("command");
    QTest::addColumn<QString>("expected");
    QTest::newRow("identify") << QStringList{"identify"} << QString("version: 9.6");
    QTest::newRow("upload") << QStringList{"setpoints", "upload", "--channel", "5"}
                            << QString("Channel 5 of 216 uploaded");
}

void TestE2eDemo::freshFolderReachesTheBuiltInSimulator()
{
    QFETCH(QStringList, command);
    QFETCH(QString, expected);
    QTemporaryDir dir;
    QProcess ctl;
    ctl.start(QStringLiteral(Q19CTL_PATH),
              QStringList{"--data-dir", dir.filePath("data"), "--id", "1"} + command);
    QVERIFY(ctl.waitForFinished(60000));
    const QString out = QString::fromLocal8Bit(ctl.readAllStandardOutput() + ctl.readAllStandardError());
    QVERIFY2(ctl.exitCode() == 0, qPrintable(out));
    QVERIFY2(out.contains("Simulator (built-in)"), qPrintable(out));
    QVERIFY2(out.contains(expected, Qt::CaseInsensitive), qPrintable(out));
}

QTEST_GUILESS_MAIN(TestE2eDemo)
#include "tst_e2e_demo.moc"
