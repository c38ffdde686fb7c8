// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Personal music libraries: the music folders of the users' homes.
#ifndef MEDIIDX_API_PERSONAL_LIBRARY_H_
#define MEDIIDX_API_PERSONAL_LIBRARY_H_

namespace mediidx {

/// True when the path is the music folder of this home folder or lies below it. The home is taken
/// as it resolves, the path as it stands.
bool is_in_personal_library(const char* home, const char* path);

}  // namespace mediidx

#endif
