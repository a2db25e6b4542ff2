#pragma once

/// The version of the library, such as "1.2.3", and its parts for the preprocessor.
#define OBD_VERSION "0.1.0"
#define OBD_VERSION_MAJOR 0
#define OBD_VERSION_MINOR 1
#define OBD_VERSION_PATCH 0
