#pragma once

/// Marks what the framework's shared library offers; everything else stays inside it.
#define OB_EXPORT __attribute__((visibility("default")))
