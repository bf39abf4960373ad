#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include <ui/Rect.h>

#include "platform/Picture.h"

/**
 * The device's internal display, behind the platform's capture calls. At first it is 1080 x 2400
 * pixels of black. It shows one colour, or a picture of its own size; all of it counts as secure
 * content.
 *
 * It belongs to the device, not to a process: processes forked after `shareDisplay` see one
 * display, whichever of them changes it, but only one of them at a time may use it. Within a
 * process all functions may be called from any thread.
 */
namespace platform {

/** What keeps captures from succeeding. */
enum class DisplayFault {
    kNone,
    kToken,    // the display has no token
    kCapture,  // captures are refused
    kResults,  // captures complete without success
    kLock,     // captured buffers cannot be locked
};

struct DisplaySize {
    uint32_t width;  // pixels, at least 1
    uint32_t height;
};

struct Color {
    uint8_t red;
    uint8_t green;
    uint8_t blue;
};

/** A change of the display; what has no value stays as it was. */
struct DisplayChange {
    // Either of these two ends a picture, and the last colour comes back.
    std::optional<DisplaySize> size;
    std::optional<Color> color;

    std::optional<Picture> picture;  // not with the former two; the display takes its size

    std::optional<uint32_t> rowPadding;  // pixels behind each row of a captured buffer
    std::optional<DisplayFault> fault;
};

/**
 * Shares the display with the processes forked from here on. Returns nothing, or why it cannot be
 * shared: one line.
 */
std::optional<std::string> shareDisplay();

/** Returns nothing, or why the picture cannot be shown: one line, and nothing has changed. */
std::optional<std::string> changeDisplay(const DisplayChange& change);

DisplayFault displayFault();
uint32_t displayRowPadding();

/** Makes what the display shows readable here. Returns false if there is no memory for it. */
bool mapDisplay();

/**
 * Copies the pixels of `area`, 4 bytes each as in `Picture`, into `pixels`, whose rows begin
 * `rowBytes` apart. What lies outside the display is left as it was, and so is
 * everything while the display cannot be mapped.
 */
void copyDisplay(const android::Rect& area, uint8_t* pixels, size_t rowBytes);

}  // namespace platform
