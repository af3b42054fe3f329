#include <gtest/gtest.h>

#include <stdexcept>
#include <string>

#include "Keel/KeelException.h"

namespace {

using Keel::Lib::KeelException;

// A kernel library may derive richer exceptions; the message must come through the virtual call.
struct DetailedException : KeelException {
    using KeelException::KeelException;
    std::string GetMessage(int verbosity) const override { return "detailed " + std::to_string(verbosity); }
};

TEST(KeelException, KeepsItsTextThroughEveryAccessAndCopy) {
    const std::string text = "List of sysinfo node 2 \"devices\" with path [300]: missing";
    try {
        throw KeelException(text);
    } catch (const std::exception& e) {  // caught as the standard base
        EXPECT_EQ(std::string(e.what()), text);
        const auto* keel = dynamic_cast<const KeelException*>(&e);
        ASSERT_NE(keel, nullptr);
        EXPECT_EQ(keel->GetMessage(0), text);
        const KeelException copy = *keel;
        EXPECT_EQ(copy.GetMessage(0), text);
        EXPECT_EQ(std::string(copy.what()), text);
        // More verbosity adds detail around the plain text, never loses it.
        const std::string verbose = keel->GetMessage(1);
        EXPECT_NE(verbose, text);
        EXPECT_NE(verbose.find(text), std::string::npos);
    }
    EXPECT_EQ(KeelException("").GetMessage(0), "");
}

TEST(KeelException, MessageIsAVirtualOperation) {
    try {
        throw DetailedException("plain");
    } catch (const KeelException& e) {
        EXPECT_EQ(e.GetMessage(0), "detailed 0");
        EXPECT_EQ(std::string(e.what()), "plain");
    }
}

}  // namespace
