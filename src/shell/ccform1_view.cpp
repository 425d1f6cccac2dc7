#include "shell/ccform1_view.h"

#include "directory/directory_view.h"
#include "link/ccform1_line_view.h"

#include <QHBoxLayout>
#include <QScrollArea>

ccForm1_view::ccForm1_view(ccForm1_directory& directory, ccForm1_engine& line, QWidget* parent)
    : QWidget(parent)
{
    setObjectName(QStringLiteral("ccForm1"));
    setWindowTitle(QStringLiteral("Glacinor Selection and Connection"));
    auto* inner = new QWidget;
    auto* row = new QHBoxLayout(inner);
    row->addWidget(new DirectoryView(directory, inner), 1);
    row->addWidget(new ccForm1_line_view(line, inner), 1);
    // On a small screen the form scrolls rather than squeezing its boxes.
    auto* scroll = new QScrollArea(this);
    scroll->setWidget(inner);
    scroll->setWidgetResizable(true);
    scroll->setFrameShape(QFrame::NoFrame);
    auto* outer = new QVBoxLayout(this);
    outer->setContentsMargins(0, 0, 0, 0);
    outer->addWidget(scroll);
}
