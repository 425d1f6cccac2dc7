#pragma once

#include <QWidget>

class ccForm1_engine;
class ccForm1_directory;

// The connection form: the directory of instruments beside the line part.
// It is the window that stands whenever no view is open.
class ccForm1_view : public QWidget {
    Q_OBJECT
public:
    ccForm1_view(ccForm1_directory& directory, ccForm1_engine& line, QWidget* parent = nullptr);
};
