#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>

// Key of the 16-byte control segment that carries one message at a time in each direction.
inline constexpr char kSgControlSegmentKey[] = "FACETOR_BRIDGE_STATIC_MAP";
// Key of the data segment that carries one exchange record at a time.
inline constexpr char kSgDataSegmentKey[] = "FACETOR_BRIDGE_DYNAMIC_MAP";
// Key of a small segment that a linked host holds for as long as its link lasts, so that a
// second host leaves the control record alone. The modeler never opens it.
inline constexpr char kSgHostLinkKey[] = "FACETOR_BRIDGE_HOST_LINK";

// The one vocabulary of the control record: every code that travels, named per direction.
// The bridge, the reference modeler and the tests use these names; the byte values are the
// codes as they travel.

// Messages from the host to the modeler.
enum class SgHostMessage : std::uint8_t {
    Idle = 0,         // the host has heard nothing else for ten polls
    NodeWritten = 1,  // a node record is in the data segment
    ShuttingDown = 2, // the host is closing
    GeometryRead = 3, // the returned geometry was read and the data segment removed
    SegmentBusy = 4,  // nothing was sent: the data segment still exists
};

// Messages from the modeler to the host. A modeler may post any byte; codes without a name
// here are ignored by the host.
enum class SgModelerMessage : std::uint8_t {
    SendSelection = 0,   // send the pending selection
    GeometryWritten = 1, // returned geometry is in the data segment
    Quit = 2,            // the modeler has quit
    NodeRead = 3,        // the node record was read and the data segment released
    ReleaseSegment = 4,  // release the data segment
    // Never travels: the host's reader uses it for "no message" and for a lock not obtained.
    NoMessage = 5,
};

// The byte a code travels as.
constexpr std::uint8_t sgCodeByte(SgHostMessage code) {
    return static_cast<std::uint8_t>(code);
}
constexpr std::uint8_t sgCodeByte(SgModelerMessage code) {
    return static_cast<std::uint8_t>(code);
}

// The whole control segment, little-endian and packed. Each direction has a slot: a flag
// (host-to-modeler: 1 = free, 0 = a message waits; modeler-to-host: 0 = a message waits,
// 1 = taken), a message code and an integer parameter.
#pragma pack(push, 1)
struct SgControlRecord {
    std::uint8_t toModelerFlag;
    std::uint8_t toModelerCode;
    std::uint8_t toModelerPadding[2];
    std::int32_t toModelerParameter;
    std::uint8_t toHostFlag;
    std::uint8_t toHostCode;
    std::uint8_t toHostPadding[2];
    std::int32_t toHostParameter;

    // The record that the host writes when it sets the control segment up: both slots free,
    // every other byte 0.
    static constexpr SgControlRecord fresh() { return {1, 0, {0, 0}, 0, 1, 0, {0, 0}, 0}; }
};
#pragma pack(pop)

static_assert(std::endian::native == std::endian::little, "the control record is little-endian");
static_assert(sizeof(SgControlRecord) == 16);
static_assert(offsetof(SgControlRecord, toModelerFlag) == 0);
static_assert(offsetof(SgControlRecord, toModelerCode) == 1);
static_assert(offsetof(SgControlRecord, toModelerPadding) == 2);
static_assert(offsetof(SgControlRecord, toModelerParameter) == 4);
static_assert(offsetof(SgControlRecord, toHostFlag) == 8);
static_assert(offsetof(SgControlRecord, toHostCode) == 9);
static_assert(offsetof(SgControlRecord, toHostPadding) == 10);
static_assert(offsetof(SgControlRecord, toHostParameter) == 12);
