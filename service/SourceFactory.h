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

namespace velmar {

std::unique_ptr<BasebandSource> makeBasebandSource(const ServiceOptions& options, std::string& error);

}  // namespace velmar
