// runQtFrontEnd: the graphical monitor: a QApplication, the Qt main queue and VelmarApp.
//
// Contract: runs until the window is closed, the application quits, or SIGTERM / SIGINT arrives; the
// termination sequence runs once on the way out. Answers the exit status.
#pragma once

#include "core/MonitorGenerator.h"

namespace velmar {

int runQtFrontEnd(int argc, char** argv, GeneratorFactory factory, bool fullscreen);

}  // namespace velmar
