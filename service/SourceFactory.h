// makeBasebandSource: the baseband source that the command line names. Each source kind is created here
// and nowhere else, so a new kind plugs in without touching the channels.
//
// Contract: answers the source (not yet prepared), or null with a one-line reason when this build cannot
// provide the kind asked for.
#pragma once

#include <memory>
#include <string>

#include "service/BasebandSource.h"
#include "service/ServiceOptions.h"
#include "service/live/LiveSource.h"

namespace velmar {

std::unique_ptr<BasebandSource> makeBasebandSource(const ServiceOptions& options, std::string& error);

// The live source's settings: the command line's, with the timing that VELMAR_DIAG_RESPONSE_SECONDS,
// VELMAR_DIAG_KEEPALIVE_SECONDS, VELMAR_DIAG_RETRY_SECONDS, VELMAR_MODEM_MANAGER_RETRY_SECONDS (between
// looks for the bus) and VELMAR_MODEM_MANAGER_CELL_SECONDS (between cell lists) may shorten (tests), and
// the device root of $VELMAR_SYSROOT.
LiveSource::Settings liveSettings(const ServiceOptions& options);

}  // namespace velmar
