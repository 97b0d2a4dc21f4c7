// SPDX-License-Identifier: MIT
#pragma once

/// Marks what the shared library exports to the host. Everything else in it is hidden.
#define VCLINK_GIT_EXPORT __attribute__((visibility("default")))
