#pragma once

#include <velmora/settingsfile.h>
