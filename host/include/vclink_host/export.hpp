// SPDX-License-Identifier: MIT
#pragma once

/// Marks what the stand-in's shared library exports. Everything else in it is hidden.
#define VCLINK_HOST_EXPORT __attribute__((visibility("default")))
