#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/**
 * The host's system properties, behind the platform's `property_get` and `property_set`. They obey
 * the device's rules:
 *  - a value has at most 91 bytes, a name 1 to 65535; `property_set` refuses others with -1;
 *  - an `ro.*` property is set once: `property_set` refuses another value for it;
 *  - an empty value reads as unset.
 *
 * The properties live in memory unless `openProperties` names a file. A file may be used by several
 * processes at once, and a write that was acknowledged survives the death of the process.
 *
 * All functions may be called from any thread; one mutex orders them.
 */
namespace platform {

/**
 * Keeps the properties in the SQLite file `path`, made if it is missing. Returns nothing, or what
 * is wrong: one line that names the file, and the properties stay where they were.
 */
std::optional<std::string> openProperties(const std::string& path);

/** Lets go of the file, which then is complete by itself; the properties in memory are none. */
void closeProperties();

/** What went wrong with the file since it was opened (one line that names it), if anything. */
std::optional<std::string> propertyFileError();

/** Drops what does not survive a boot of the device: all but `persist.*` and `ro.*`. */
void dropVolatileProperties();

/** Why the device would refuse a property of this name and value, if it would. */
std::optional<std::string> refuseProperty(std::string_view name, std::string_view value);

/**
 * Sets a property as the rest of the device would, an `ro.*` that is set too (a new system image
 * does so); no value deletes it. Does nothing if `refuseProperty` has a reason.
 */
void setDeviceProperty(const std::string& name, const std::optional<std::string>& value);

/** Calls `observer` after every successful `property_set`, on its thread. */
void observePropertySet(std::function<void(const char* name, const char* value)> observer);

/** The properties in memory as bytes, and the way back, to hand them to another process. */
std::vector<unsigned char> saveProperties();
void restoreProperties(const std::vector<unsigned char>& bytes);

}  // namespace platform
