// SPDX-License-Identifier: MIT
#pragma once

/// Marks what the shared library shows to the host; everything else in it is hidden.
#define VCLINK_GIT_EXPORT __attribute__((visibility("default")))
