#pragma once

namespace report::page {

/** The files page.css and page.js, and their hashes as a Content-Security-Policy names them. */
extern const char kStyle[];
extern const char kStyleHash[];
extern const char kScript[];
extern const char kScriptHash[];

}  // namespace report::page
