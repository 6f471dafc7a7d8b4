// SHA-256 digests of files through the platform's library: a file longer than one read block.
// Small files are the golden run download_digests's; a download that cannot be read is
// update_file_digest_test's.
#include "platform/digest.h"

#include <gtest/gtest.h>

#include "tests/support/test_machine.h"

namespace {

using plat::digest::Sha256File;

// Several read blocks, the last one short: every byte counts once, in order.
TEST(Digest, AFileOfSeveralBlocksIsDigestedWhole) {
    pextest::TestMachine m;
    std::string bytes(3 * (1u << 20) + 7, '\0');
    for (std::size_t i = 0; i < bytes.size(); ++i) bytes[i] = static_cast<char>((i * 7) % 251);
    m.WriteFile("C:\\d\\big.bin", bytes);
    std::string hex;
    ASSERT_TRUE(Sha256File("C:\\d\\big.bin", &hex));
    EXPECT_EQ(hex, "f22b2b9b77c00d49092ef7c8c522d1067a19423ab30ed2aae987e511b95d82a2");
}

}  // namespace
