#include "scanner/NVXScanner.h"
