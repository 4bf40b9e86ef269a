#include "agent/main.h"
