#include "shell/frmsmarthlp_view.h"

#include "shell/frmsmarthlp_engine.h"

#include <QLabel>
#include <QPushButton>
#include <QVBoxLayout>

frmsmarthlp_view::frmsmarthlp_view(frmsmarthlp_engine& engine, QWidget* parent)
    : QWidget(parent, Qt::Tool | Qt::WindowStaysOnTopHint), m_engine(engine)
{
    setObjectName(QStringLiteral("frmsmarthlp"));
    setWindowTitle(tr("Help"));
    auto* layout = new QVBoxLayout(this);
    m_text = new QLabel(tr("Point at a box or a button to see what it does."), this);
    m_text->setObjectName(QStringLiteral("helptext"));
    m_text->setWordWrap(true);
    m_text->setMinimumWidth(280);
    layout->addWidget(m_text, 1);
    auto* cancel = new QPushButton(tr("Cancel"), this);
    cancel->setObjectName(QStringLiteral("Cancel"));
    layout->addWidget(cancel, 0, Qt::AlignRight);
    connect(cancel, &QPushButton::clicked, &m_engine, &frmsmarthlp_engine::Cancel_Click);
    connect(&m_engine, &frmsmarthlp_engine::changed, this, [this] {
        if (!m_engine.text.isEmpty())
            m_text->setText(m_engine.text);
    });
    connect(&m_engine, &frmsmarthlp_engine::unloadRequested, this, &QWidget::close);
    setAttribute(Qt::WA_DeleteOnClose);
}
