#include "platform/change_notifier.h"

#include <QtTest>

// An engine's views are told once per procedure, however it ends, and before
// a box when asked.
class tst_change_notifier : public QObject {
    Q_OBJECT
private slots:
    void toldOncePerOutermostProcedure_data();
    void toldOncePerOutermostProcedure();
};

void tst_change_notifier::toldOncePerOutermostProcedure_data()
{
    QTest::addColumn<int>("nested");     // procedures called from the first
    QTest::addColumn<bool>("earlyReturn");
    QTest::addColumn<bool>("box");       // a box stands in the innermost
    QTest::addColumn<int>("told");
    QTest::newRow("alone") << 0 << false << false << 1;
    QTest::newRow("calling two others") << 2 << false << false << 1;
    QTest::newRow("leaving early") << 1 << true << false << 1;
    QTest::newRow("box inside") << 2 << false << true << 2;
}

void tst_change_notifier::toldOncePerOutermostProcedure()
{
    QFETCH(int, nested);
    QFETCH(bool, earlyReturn);
    QFETCH(bool, box);
    QFETCH(int, told);
    int count = 0;
    int seenBeforeBox = -1;
    ChangeNotifier n([&] { ++count; });
    std::function<void(int)> run = [&](int depth) {
        const auto p = n.procedure();
        QVERIFY(n.inProcedure());
        if (depth == 0) {
            if (box) {
                n.flush();
                seenBeforeBox = count;
            }
            return;
        }
        if (earlyReturn)
            return;
        run(depth - 1);
        QCOMPARE(count, box ? 1 : 0); // nothing told while the outer one runs
    };
    run(nested);
    QCOMPARE(count, told);
    QVERIFY(!n.inProcedure());
    if (box)
        QCOMPARE(seenBeforeBox, 1);
}

QTEST_GUILESS_MAIN(tst_change_notifier)
#include "tst_change_notifier.moc"
