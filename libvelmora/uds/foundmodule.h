#pragma once

#include <velmora/modules.h>
