// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Includes that the check of includes has to refuse, and one that it has not.
#include "../other.h"
#include "database/beside.h"
#include "support/below.h"
