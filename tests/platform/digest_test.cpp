// SHA-256 digests of files through the platform's library: the standard vectors and a file
// longer than one read block. A download that cannot be read is update_file_digest_test's.
#include "platform/digest.h"

#include <gtest/gtest.h>

#include "tests/support/test_machine.h"

namespace {

using plat::digest::Sha256File;

class Digest : public ::testing::Test {
protected:
    pextest::TestMachine m;
};

TEST_F(Digest, TheStandardVectorsInLowerCase) {
    m.WriteFile("C:\\d\\empty.bin", "");
    m.WriteFile("C:\\d\\abc.bin", "abc");
    std::string hex;
    ASSERT_TRUE(Sha256File("C:\\d\\empty.bin", &hex));
    EXPECT_EQ(hex, "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855");
    ASSERT_TRUE(Sha256File("C:\\D\\ABC.BIN", &hex));
    EXPECT_EQ(hex, "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad");
}

// Several read blocks, the last one short: every byte counts once, in order.
TEST_F(Digest, AFileOfSeveralBlocksIsDigestedWhole) {
    std::string bytes(3 * (1u << 20) + 7, '\0');
    for (std::size_t i = 0; i < bytes.size(); ++i) bytes[i] = static_cast<char>((i * 7) % 251);
    m.WriteFile("C:\\d\\big.bin", bytes);
    std::string hex;
    ASSERT_TRUE(Sha256File("C:\\d\\big.bin", &hex));
    EXPECT_EQ(hex, "f22b2b9b77c00d49092ef7c8c522d1067a19423ab30ed2aae987e511b95d82a2");
}

}  // namespace
