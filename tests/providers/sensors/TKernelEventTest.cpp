// SPDX-License-Identifier: Apache-2.0
#include "providers/sensors/TKernelEvent.h"

#include <gmock/gmock.h>

namespace NQRVZEP20 {
namespace {

using TEvent = TKernelEvent;

TEST(KernelMessageTest, ALineHasPriorityNumberTimeAndText) {
  auto const message = KernelMessageFrom("3,467,26740386,-,caller=T1;Out of memory; a\\x0ab\\x5c \\xzz");
  ASSERT_TRUE(message);
  EXPECT_EQ(message->fFacility, 0u);
  EXPECT_EQ(message->fNumber, 467u);
  EXPECT_EQ(message->fMicroseconds, 26740386u);
  EXPECT_EQ(message->fText, "Out of memory; a\nb\\ \\xzz");
}

TEST(KernelMessageTest, AnotherFormIsRefused) {
  for (char const* line : {"", "3", "3,4", "3,4,5", "3,4,5,-", "a,4,5,-;text", "3,-4,5,-;text", "3,4,99999999999999999999,-;text",
                           " SUBSYSTEM=scsi", "[    1.0] text"})
    EXPECT_FALSE(KernelMessageFrom(line)) << line;
}

struct TRow {
  char const* fText;
  TEvent::EKind fKind;
  TEvent::ESeverity fSeverity;
  char const* fSubject;
};

class KernelEventTest : public testing::TestWithParam<TRow> {};

TEST_P(KernelEventTest, AnErrorIsRecognised) {
  auto const event = KernelEventFrom({0, 1, 2, GetParam().fText});
  ASSERT_TRUE(event) << GetParam().fText;
  EXPECT_EQ(event->fKind, GetParam().fKind);
  EXPECT_EQ(event->fSeverity, GetParam().fSeverity);
  EXPECT_EQ(event->fSubject, GetParam().fSubject);
  EXPECT_EQ(event->fMessage.fText, GetParam().fText);
}

INSTANTIATE_TEST_SUITE_P(
    Texts, KernelEventTest,
    testing::Values(
        TRow{"Out of memory: Killed process 138 (tail) total-vm:414368kB, anon-rss:411224kB", TEvent::kOutOfMemory,
             TEvent::kMajor, "tail"},
        TRow{"Out of memory: Kill process 4711 (my sql) score 912 or sacrifice child", TEvent::kOutOfMemory, TEvent::kMajor,
             "my sql"},
        TRow{"Out of memory (oom_kill_allocating_task): Killed process 158 (tail) total-vm:414368kB, anon-rss:411224kB",
             TEvent::kOutOfMemory, TEvent::kMajor, "tail"},
        TRow{"Memory cgroup out of memory: Killed process 158 (tail) total-vm:7048kB", TEvent::kOutOfMemory, TEvent::kMinor,
             "tail"},
        TRow{"mce: [Hardware Error]: CPU 0: Machine Check: 0 Bank 9: 8c00004000010091", TEvent::kProcessor, TEvent::kDegraded,
             "CPU 0"},
        TRow{"mce: [Hardware Error]: CPU 3: Machine Check: 0 Bank 5: bea0000000000108", TEvent::kProcessor, TEvent::kCritical,
             "CPU 3"},
        TRow{"mce: [Hardware Error]: CPU 0: Machine Check Exception: 5 Bank 9: bd000000000000c0", TEvent::kProcessor,
             TEvent::kCritical, "CPU 0"},
        TRow{"[Hardware Error]: Corrected error, no action required.", TEvent::kProcessor, TEvent::kDegraded, ""},
        TRow{"[Hardware Error]: Deferred error, no action required.", TEvent::kProcessor, TEvent::kMajor, ""},
        TRow{"[Hardware Error]: Uncorrected, software restartable error.", TEvent::kProcessor, TEvent::kCritical, ""},
        TRow{"[Hardware Error]: System Fatal error.", TEvent::kProcessor, TEvent::kCritical, ""},
        TRow{"EDAC MC0: 1 CE memory read error on CPU_SrcID#0_Ha#0_Chan#0_DIMM#0 (channel:0 slot:0 page:0x1)", TEvent::kMemory,
             TEvent::kDegraded, "CPU_SrcID#0_Ha#0_Chan#0_DIMM#0"},
        TRow{"EDAC MC1: 1 UE memory read error on CPU_SrcID#1_Chan#2_DIMM#0 (channel:2 slot:0)", TEvent::kMemory,
             TEvent::kCritical, "CPU_SrcID#1_Chan#2_DIMM#0"},
        TRow{"Memory failure: 0x12340: recovery action for dirty LRU page: Recovered", TEvent::kMemory, TEvent::kMajor, ""},
        TRow{"pcieport 0000:00:1c.0: AER: PCIe Bus Error: severity=Corrected, type=Physical Layer, (Receiver ID)",
             TEvent::kPciExpress, TEvent::kDegraded, "0000:00:1c.0"},
        TRow{"e1000e 0000:02:00.0: PCIe Bus Error: severity=Uncorrected (Non-Fatal), type=Transaction Layer", TEvent::kPciExpress,
             TEvent::kMajor, "0000:02:00.0"},
        TRow{"pcieport 0000:00:1c.0: DPC: containment event, status:0x1f01 source:0x0000", TEvent::kPciExpress, TEvent::kCritical,
             "0000:00:1c.0"},
        TRow{"{1}[Hardware Error]: event severity: recoverable", TEvent::kHardware, TEvent::kMajor, ""},
        TRow{"{2}[Hardware Error]: event severity: corrected", TEvent::kHardware, TEvent::kDegraded, ""},
        TRow{"{3}[Hardware Error]: event severity: fatal", TEvent::kHardware, TEvent::kCritical, ""},
        TRow{"NMI: PCI system error (SERR) for reason b1 on CPU 0.", TEvent::kHardware, TEvent::kCritical, ""},
        TRow{"NMI: IOCK error (debug interrupt?) for reason 71 on CPU 0.", TEvent::kHardware, TEvent::kCritical, ""},
        TRow{"BERT: Error records from previous boot:", TEvent::kHardware, TEvent::kCritical, ""},
        TRow{"blk_update_request: I/O error, dev sdc, sector 2048 op 0x0:(READ) flags 0x0", TEvent::kDisk, TEvent::kMajor, "sdc"},
        TRow{"I/O error, dev nvme0n1, sector 8 op 0x1:(WRITE)", TEvent::kDisk, TEvent::kMajor, "nvme0n1"},
        TRow{"critical medium error, dev sda, sector 4656 op 0x0:(READ) flags 0x80700", TEvent::kDisk, TEvent::kMajor, "sda"},
        TRow{"Buffer I/O error on dev dm-0, logical block 0, async page read", TEvent::kDisk, TEvent::kMajor, "dm-0"},
        TRow{"Buffer I/O error on dev md127, logical block 8, lost async page write", TEvent::kDisk, TEvent::kMajor, "md127"},
        TRow{"timeout error, dev nvme0n1, sector 8 op 0x0:(READ) flags 0x0 phys_seg 1 prio class 2", TEvent::kDisk,
             TEvent::kMajor, "nvme0n1"},
        TRow{"protection error, dev sda, sector 8 op 0x0:(READ) flags 0x0 phys_seg 1 prio class 2", TEvent::kDisk, TEvent::kMajor,
             "sda"},
        TRow{"device offline error, dev sdb, sector 8 op 0x1:(WRITE) flags 0x0 phys_seg 1 prio class 2", TEvent::kDisk,
             TEvent::kMajor, "sdb"},
        TRow{"recoverable transport error, dev sdc, sector 8 op 0x0:(READ) flags 0x0 phys_seg 1 prio class 2", TEvent::kDisk,
             TEvent::kMinor, "sdc"},
        TRow{"nvme nvme0: I/O 12 QID 3 timeout, aborting", TEvent::kDisk, TEvent::kMinor, "nvme0"},
        TRow{"nvme nvme0: controller is down; will reset: CSTS=0xffffffff, PCI_STATUS=0x10", TEvent::kDisk, TEvent::kMajor,
             "nvme0"},
        TRow{"ata1.00: failed command: READ FPDMA QUEUED", TEvent::kDisk, TEvent::kMinor, "ata1.00"},
        TRow{"EXT4-fs error (device dm-0): ext4_journal_check_start:83: comm ext4lazyinit: Detected aborted journal",
             TEvent::kFileSystem, TEvent::kMajor, "dm-0"},
        TRow{"XFS (sdb1): Metadata corruption detected at xfs_agf_read_verify+0x70/0x120", TEvent::kFileSystem, TEvent::kMajor,
             "sdb1"},
        TRow{"critical target error, dev sdb, sector 4096 op 0x1:(WRITE) flags 0x8800", TEvent::kDisk, TEvent::kMajor, "sdb"},
        TRow{"md/raid1:md0: Disk failure on sdb1, disabling device.\nmd/raid1:md0: Operation continuing on 1 devices.",
             TEvent::kDisk, TEvent::kMinor, "sdb1"},
        TRow{"BTRFS critical (device sdb1): unable to find logical 5324800 length 4096", TEvent::kFileSystem, TEvent::kMajor,
             "sdb1"},
        TRow{"BTRFS error (device sdb1): block=30408704 read time tree block corruption detected", TEvent::kFileSystem,
             TEvent::kMajor, "sdb1"},
        TRow{"BTRFS error (device sdb1): bdev /dev/sdb1 errs: wr 1, rd 0, flush 0, corrupt 0, gen 0", TEvent::kFileSystem,
             TEvent::kMajor, "sdb1"},
        TRow{"BTRFS error (device dm-0: state EA): Transaction aborted (error -5)", TEvent::kFileSystem, TEvent::kMajor, "dm-0"},
        TRow{"BTRFS error (device sda2): parent transid verify failed on logical 5324800 mirror 1 wanted 9 found 7",
             TEvent::kFileSystem, TEvent::kMajor, "sda2"},
        TRow{"BTRFS error (device sda2): unable to fixup (regular) error at logical 20971520 on dev /dev/sda2",
             TEvent::kFileSystem, TEvent::kMajor, "sda2"},
        TRow{"BTRFS error (device sda2): bad tree block start, mirror 1 want 30408704 have 0", TEvent::kFileSystem,
             TEvent::kMajor, "sda2"},
        TRow{"BTRFS warning (device sda2): csum failed root 5 ino 257 off 0 csum 0x98f94189 expected csum 0x94b62931 mirror 1",
             TEvent::kFileSystem, TEvent::kMajor, "sda2"}));

TEST(KernelEventTest, OtherMessagesAreNoErrors) {
  for (char const* text :
       {"", "oom_reaper: reaped process 138 (tail)", "EXT4-fs (dm-0): mounted filesystem with ordered data mode.",
        "I/O error, dev sr0, sector 0 op 0x0:(READ)", "blk_update_request: I/O error, dev fd0, sector 0",
        "Out of memory and no killable processes...", "timeout error, dev sr0, sector 0 op 0x0:(READ)",
        "operation not supported error, dev loop0, sector 130944 op 0x9:(WRITE_ZEROES)",
        "critical target error, dev sdb, sector 1 op 0x3:(DISCARD)",
        "blk_update_request: critical target error, dev sdb, sector 1 op 0x9:(WRITE_ZEROES) flags 0x400",
        "BTRFS error (device sda2): unrecognized mount option 'foo'", "BTRFS info (device sda2): bdev /dev/sda2 errs: wr 1, rd 0",
        "ata2.00: failed command: PACKET", "{1}[Hardware Error]: event severity: info", "EDAC MC: Ver: 3.0.0",
        "mce: [Hardware Error]: Machine check events logged", "systemd[1]: Out of memory: Killed process 1 (a) "})
    EXPECT_FALSE(KernelEventFrom({0, 1, 2, text})) << text;
}

TEST(KernelEventTest, AProgramCannotReportAnError) {
  constexpr unsigned daemon = 3;
  EXPECT_FALSE(KernelEventFrom({daemon, 1, 2, "Out of memory: Killed process 138 (tail) total-vm:414368kB"}));
}

}  // namespace
}  // namespace NQRVZEP20
