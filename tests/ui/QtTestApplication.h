// The one QApplication of the test program, on Qt's offscreen platform, made on first use and kept to the
// end.
#pragma once

#ifdef VELMAR_WITH_QT

#include <QApplication>

namespace velmar::testing {

QApplication& qtTestApplication();

}  // namespace velmar::testing

#endif
