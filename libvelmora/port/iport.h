#pragma once

#include <velmora/iport.h>
