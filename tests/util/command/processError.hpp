// SPDX-License-Identifier: MIT
#pragma once

// boost::process::process_error, wherever the release of Boost has it (see util/runCommand.cpp).
#if __has_include(<boost/process/v1/exception.hpp>)
#define BOOST_PROCESS_VERSION 1
// Brings boost/process/v1/exception.hpp, which does not compile alone.
#include <boost/process/v1/detail/config.hpp>
#else
#include <boost/process/exception.hpp>
#endif
