// OxInodeTable.h: which files have been seen, by device and inode number.
//
// A tree walk records each directory it enters so that links cannot lead it
// into a directory twice. The table keeps one OxInodeDevice per device met;
// each holds a small open-addressing set of inode numbers (quadratic probing
// over a prime number of slots, 13 at the start, growing at half load).
// Inode number 0 means "no inode": it is never stored and never found.
//
//   OxInodeTable seen;
//   if (seen.exists(&status) == OxFalse) seen.add(&status);
//
// Device and inode numbers are kept at 64 bits. With a trace threshold of 99
// or more (OxPrt::setTraceThreshold) every insertion writes its probe
// position, use count and element on standard error.
#ifndef OXBASE_IO_OXINODETABLE_H
#define OXBASE_IO_OXINODETABLE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"
#include "oxbase/platform/OxStat.h"

#include <cstdint>

/// The inode numbers seen on one device.
class OXBASE_API OxInodeDevice {
public:
    /// Stores the id and allocates 13 free slots.
    explicit OxInodeDevice(std::uint64_t deviceId);
    OxInodeDevice(const OxInodeDevice&) = delete;
    OxInodeDevice& operator=(const OxInodeDevice&) = delete;
    /// Frees the slots; the size becomes 0.
    virtual ~OxInodeDevice();

    std::uint64_t getDeviceId() const { return deviceId; }

    /// Records the inode of `status`. OxTrue when there is nothing to object
    /// to: a null status, inode 0 (nothing stored), or a new inode (stored).
    /// OxFalse for a status of another device (nothing stored) and for an
    /// inode that is already recorded.
    OxBool add(const OxStat* status);
    /// Whether the inode of `status` is recorded: OxFalse for a null status,
    /// another device and inode 0.
    OxBool exists(const OxStat* status) const;

    /// Writes "---- OxInodeDevice", the device line, "Inode table: " and the
    /// closing line, each ended by a newline, without indentation.
    std::ostrstream* dump(std::ostrstream* s) const;

    // Additions for callers that look inside the set.

    /// Number of slots.
    unsigned int getSize() const { return size; }
    /// Elements stored since creation or the last growth.
    unsigned int getCount() const { return count; }
    /// Whether `inode` is in the set (0 never is).
    OxBool contains(std::uint64_t inode) const;

private:
    struct Slot {
        std::uint64_t element = 0; ///< the inode number
        unsigned int ref = 0;      ///< times inserted; 0 for a free slot
    };

    unsigned int findPos(std::uint64_t element) const;
    /// Inserts `element`: OxTrue when it was new (may grow the set), OxFalse
    /// when its slot was in use (its use count goes up).
    OxBool insert(std::uint64_t element);

    std::uint64_t deviceId;
    unsigned int size = 0;
    unsigned int count = 0;
    Slot* array = nullptr;
};

/// The devices met, in the order first met; the table owns them.
class OXBASE_API OxInodeTable {
public:
    OxInodeTable() = default;
    OxInodeTable(const OxInodeTable&) = delete;
    OxInodeTable& operator=(const OxInodeTable&) = delete;
    /// Deletes every device.
    virtual ~OxInodeTable();

    /// Records the status in the set of its device, which is created when it
    /// is new. OxFalse for a null status; otherwise the device's add.
    OxBool add(const OxStat* status);
    /// Whether the status is recorded: OxFalse for a null status and for an
    /// unknown device.
    OxBool exists(const OxStat* status) const;

    /// Writes "---- OxInodeTable", "Inode tables:", the dump of each device
    /// and "---- End of OxInodeTable", each ended by a newline.
    std::ostrstream* dump(std::ostrstream* s) const;

    /// Number of devices met.
    unsigned int getNbDevices() const { return devices.getLength(); }

private:
    /// The device with the device number of `status`, or null.
    OxInodeDevice* find(const OxStat* status) const;

    OxGList<OxInodeDevice*> devices;
};

#endif
