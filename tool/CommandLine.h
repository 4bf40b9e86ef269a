// What the user asked for, out of the arguments of the program.
//
// Called once by main.
#pragma once

#include <ostream>
#include <variant>

#include "tool/AgentControlCommand.h"
#include "tool/AgentStatusCommand.h"
#include "tool/DoctorCommand.h"
#include "tool/ExitStatus.h"
#include "tool/IndexQueryCommand.h"
#include "tool/IndexShowCommand.h"
#include "tool/IndexStatusCommand.h"
#include "tool/IndexUpdateCommand.h"
#include "tool/LogCommand.h"
#include "tool/PreviewCommand.h"
#include "tool/ShowCommand.h"
#include "tool/SummaryCommand.h"

namespace norvex {

// One alternative a command.
using CommandRequest =
    std::variant<IndexUpdateRequest, IndexStatusRequest, IndexQueryRequest, IndexShowRequest, PreviewRequest,
                 SummaryRequest, ShowRequest, LogRequest, AgentStatusRequest, AgentRunRequest,
                 AgentEnableRequest, AgentDisableRequest, DoctorRequest>;

// The command that was asked for; or the status to end with when nothing is left to do, because help was
// asked for and written to `out`, or because `err` has been told what makes no sense.
std::variant<CommandRequest, ExitStatus> parseCommandLine(int argc, const char* const* argv,
                                                          std::ostream& out, std::ostream& err);

}  // namespace norvex
