#include "setpoints/upload_progress_view.h"

#include "platform/widget_binder.h"
#include "setpoints/upload_progress_engine.h"

#include <QLabel>
#include <QProgressBar>
#include <QVBoxLayout>

upload_progress_view::upload_progress_view(upload_progress_engine& engine, QWidget* parent)
    : QWidget(parent, Qt::Dialog), m_engine(engine)
{
    setObjectName(QStringLiteral("upload"));
    auto* layout = new QVBoxLayout(this);
    m_label1 = new QLabel(this);
    m_label1->setObjectName(QStringLiteral("Label1"));
    m_label2 = new QLabel(this);
    m_label2->setObjectName(QStringLiteral("Label2"));
    m_bar = new QProgressBar(this);
    m_bar->setObjectName(QStringLiteral("ProgressBar1"));
    m_bar->setRange(0, upload_progress_engine::ProgressBar1_Max);
    layout->addWidget(m_label1);
    layout->addWidget(m_label2);
    layout->addWidget(m_bar);
    setMinimumWidth(360);
    auto* binder = new WidgetBinder(this);
    binder->bind(engine.Label1, m_label1);
    binder->bind(engine.Label2, m_label2);
    binder->bind(engine.ProgressBar1, m_bar);
    binder->setAfterRefresh([this] {
        setWindowTitle(m_engine.Caption.text);
        setVisible(m_engine.loaded);
    });
    connect(&engine, &upload_progress_engine::changed, binder, &WidgetBinder::scheduleRefresh);
    binder->refresh();
}
