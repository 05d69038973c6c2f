#pragma once

#include <sys/types.h>

namespace cfg32::platform {

// What chown(2) takes for "leave it as it is".
inline constexpr uid_t unchanged_owner = static_cast<uid_t>(-1);
inline constexpr gid_t unchanged_group = static_cast<gid_t>(-1);

// Turn a name of the user or group database into its number; a null name yields "unchanged".
// False with errno EINVAL for an unknown name, else with the errno of the lookup.
bool find_owner(const char* name, uid_t& owner);
bool find_group(const char* name, gid_t& group);

}  // namespace cfg32::platform
