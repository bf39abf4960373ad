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
 * Fixes which file `path` is, in this process and in those that it forks later: `openProperties`
 * fails if the path names another file by then, or none. Makes the file if it is missing. A second
 * call for the same path fails likewise. Returns nothing, or why the file cannot keep properties:
 * one line that names it.
 */
std::optional<std::string> pinPropertyFile(const std::string& path);

/**
 * Keeps the properties in the file `path` from now on. A missing or an empty file becomes a store;
 * a store is taken; anything else is refused and stays as it is, to the byte. Returns nothing, or
 * what is wrong: one line that names the file, and the properties stay where they were.
 */
std::optional<std::string> openProperties(const std::string& path);

/**
 * Lets go of the file, which is complete by itself if no other process uses it. The properties in
 * memory are none. Returns the first error since the file was opened; that the file was deleted or
 * replaced in that time is one.
 */
std::optional<std::string> closeProperties();

/**
 * The first read or write that failed since the file was opened, if any: one line that names the
 * file. Cheap: it looks at neither the file nor the database.
 */
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
