#include "setpoints/upload_progress_engine.h"
#include "setpoints/upload_progress_view.h"

#include <QLabel>
#include <QProgressBar>
#include <QtTest>

class tst_widget_upload_progress_view : public QObject {
    Q_OBJECT
private slots:
    void followsTheEngine();
};

void tst_widget_upload_progress_view::followsTheEngine()
{
    upload_progress_engine engine;
    upload_progress_view view(engine);
    QVERIFY(!view.isVisible());
    engine.Show(QStringLiteral("Upload"), QStringLiteral("Channel 0 of 216 Channels Uploaded"),
                QStringLiteral("Up Loading all Channels from the Glacinor"), 0);
    QTRY_VERIFY(view.isVisible());
    QCOMPARE(view.windowTitle(), QStringLiteral("Upload"));
    auto* label1 = view.findChild<QLabel*>(QStringLiteral("Label1"));
    auto* bar = view.findChild<QProgressBar*>(QStringLiteral("ProgressBar1"));
    QVERIFY(label1 && bar);
    engine.setProgress(27, QStringLiteral("Channel 28 of 216 Channels Uploaded"));
    QTRY_COMPARE(label1->text(), QStringLiteral("Channel 28 of 216 Channels Uploaded"));
    QCOMPARE(bar->value(), 27);
    QCOMPARE(bar->maximum(), 216);
    engine.Unload();
    QTRY_VERIFY(!view.isVisible());
}

QTEST_MAIN(tst_widget_upload_progress_view)
#include "tst_widget_upload_progress_view.moc"
