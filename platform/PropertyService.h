#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/**
 * The host's system properties, behind the platform's `property_get` and `property_set`. They obey
 * the device's rules:
 *  - A value has at most 91 bytes, a name 1 to 65535. `property_set` refuses others with -1.
 *  - An `ro.*` property is set once. `property_set` refuses to set it again with -1.
 *  - An empty value reads as unset.
 *
 * The properties live in memory until `openProperties` names a file. Several processes may use one
 * file. A write that was acknowledged survives the death of the process.
 *
 * All functions but `observePropertySet` may be called from any thread. One mutex orders the reads
 * and writes. The observer runs outside of it.
 */
namespace platform {

/**
 * Ties `path` to the file that it names now, in this process and in those that it forks later. If
 * the path names another file by then, or none, `openProperties` fails. So does a second call of
 * this. Creates an empty file if there is none. Returns nothing, or why the file cannot keep
 * properties: one line that names it.
 */
std::optional<std::string> pinPropertyFile(const std::string& path);

/**
 * Keeps the properties in the file `path` from now on. By what the file is:
 *  - missing or empty: it becomes a store;
 *  - a store, also of an earlier build: the properties are those in it;
 *  - anything else, a store of a later build too: it is refused and keeps every byte.
 *
 * Returns nothing, or what is wrong: one line that names the file. After an error the properties
 * stay where they were.
 */
std::optional<std::string> openProperties(const std::string& path);

/**
 * Closes the file and goes on in memory, without any properties. If no other process uses the file,
 * it then holds everything by itself. Returns the first error since it was opened: a read or a
 * write that failed, or that the file was deleted or replaced.
 */
std::optional<std::string> closeProperties();

/**
 * The first read or write that failed since the file was opened: one line that names it. Cheap
 * enough to be called at every step: it takes the mutex and looks at no file.
 */
std::optional<std::string> propertyFileError();

/** Drops what does not survive a boot of the device: all but `persist.*` and `ro.*`. */
void dropVolatileProperties();

/** Why the device would refuse a property of this name and value. Nothing if it would not. */
std::optional<std::string> refuseProperty(std::string_view name, std::string_view value);

/**
 * Sets a property on behalf of the rest of the device; no value deletes it. It may set an `ro.*`
 * again, as a new system image does. Does nothing to what `refuseProperty` refuses. The observer is
 * not called.
 */
void setDeviceProperty(const std::string& name, const std::optional<std::string>& value);

/**
 * Calls `observer` after every successful `property_set`, on the thread that made the call. To be
 * set while no other thread sets properties.
 */
void observePropertySet(std::function<void(const char* name, const char* value)> observer);

/** The properties in memory as bytes, for another process. Not while a file keeps them. */
std::vector<unsigned char> saveProperties();

/** Replaces the properties in memory by those that `saveProperties` returned. */
void restoreProperties(const std::vector<unsigned char>& bytes);

}  // namespace platform
