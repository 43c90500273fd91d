#pragma once
// Moved to platform_core so that the disc records can use it too.
#include "platform/TextDecoding.h"
