// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Includes that the check of includes has to refuse.
#include <libpq-fe.h>

#include "playlist/beside.h"
