#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "day/Use.h"

namespace report {

/**
 * The app behind a client: its package with the client's tag behind, as "com.example.chat
 * (msf.core.u)" for the tag com.example.chat.msf.core.u; of several packages that share a uid the
 * first, and how many there are besides, as "com.example.services +3 (atcl)". Without a package it
 * is the tag; where nothing names the client but the library's calls, "pkg/opPkg" if they differ.
 */
std::string nameApp(const day::Holder& holder);

/** The apps of a uid in the same way, or "uid 1000". */
std::string nameUid(int32_t uid, const std::vector<std::string>& packages);

/** The platform's word for a sensor's type, as "accelerometer", or "type N". */
std::string nameType(int32_t type);

/**
 * A sensor by its name, behind the word for its type where that is not in it, or by the word. Types
 * of makers have none.
 */
std::string nameSensor(int32_t type, const std::string& name);

/** The same, or its handle if the device does not list it. */
std::string nameSensor(const day::Holder& holder);

}  // namespace report
