// PortListing: kxserverd --list-devices, the candidate diagnostic ports and which of them answer.
//
// Contract: every candidate that DeviceDiscovery finds under root is opened and probed with a version
// request (a lone 0x7E first), all at once, each as the live session probes: timing.probeAttempts tries of
// timing.responseSeconds. One line per candidate goes to out, in discovery order: its description and
// "answers", "silent", or "cannot open: reason". With no candidate, one line says so. Nothing else is sent
// to the ports.
#pragma once

#include <cstdio>
#include <string>

#include "service/live/DiagSession.h"

namespace velmar::live {

void listDiagnosticPorts(const std::string& root, const DiagTiming& timing, std::FILE* out);

}  // namespace velmar::live
