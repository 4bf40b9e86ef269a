# The run version stands in the identity of the agent and nowhere else: the names of the timer and of whatever else carries it
# are made from there, so that they cannot differ from what the agent writes into the preferences.
set(run_version_source ${CMAKE_SOURCE_DIR}/agent/AgentIdentity.h)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${run_version_source})

file(READ ${run_version_source} identity)
string(REGEX MATCHALL "currentRunVersion = [0-9]+" definitions "${identity}")
list(LENGTH definitions definition_count)
if(NOT definition_count EQUAL 1)
  message(FATAL_ERROR "${run_version_source} has to say exactly once: currentRunVersion = NUMBER")
endif()
string(REGEX MATCH "[0-9]+" NORVEX_RUN_VERSION "${definitions}")

set(NORVEX_LABEL com.brixo.NorvexAgent)
set(NORVEX_SERVICE ${NORVEX_LABEL}.service)
set(NORVEX_TIMER ${NORVEX_LABEL}.run${NORVEX_RUN_VERSION}.timer)
