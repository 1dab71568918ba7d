// The committed generated sources are what the generator makes from the
// DMTF classes and tavrin.mof.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <string>

TEST(Regeneration, CommittedFilesAreUpToDate) {
    const char* mof = TVRN_CIM_SCHEMA_MOF;
    if (FILE* f = std::fopen(mof, "r"))
        std::fclose(f);
    else
        GTEST_SKIP() << "DMTF classes not found at " << mof
                     << " (set TVRN_CIM_SCHEMA_MOF); the generated files were not checked";
    const char* python = TVRN_PYTHON;
    if (!*python)
        GTEST_SKIP() << "no Python 3 interpreter; the generated files were not checked";
    const char* src = std::getenv("TVRN_SOURCE_DIR");
    ASSERT_NE(src, nullptr);

    std::string cmd = std::string("'") + python + "' '" + src +
                      "/tools/schemagen/schemagen.py' --check --cim-mof '" + mof + "' --root '" +
                      src + "' 2>&1";
    FILE* p = popen(cmd.c_str(), "r");
    ASSERT_NE(p, nullptr);
    std::string output;
    char buf[512];
    while (size_t n = std::fread(buf, 1, sizeof buf, p))
        output.append(buf, n);
    EXPECT_EQ(pclose(p), 0) << output << "Run the target regenerate-schema and commit the result.";
}
