/// \file
#pragma once

/// Marks what the library exports; everything else stays inside.
#define ZELKORA_MEDIA_API __attribute__((visibility("default")))
