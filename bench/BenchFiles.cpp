// BenchFiles.cpp: listing a tree, asking about one file, and joining and cutting paths, beside the standard library and
// the plain system calls.

#include "Bench.h"

#include "KTFileUtil.h"

#include <windows.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <system_error>
#include <vector>

namespace bench {

namespace {

constexpr char kGroup[] = "files";
constexpr char kList[] = "files-list";
constexpr char kGrowth[] = "files-growth";
constexpr char kStandard[] = "std-filesystem";
constexpr char kSystem[] = "system";
constexpr int kFilesInFolder = 100;

// A tree of empty files in the temporary folder, made at its first use and removed at the end.
class Tree {
  public:
    explicit Tree(int folders) : m_Root(std::filesystem::temp_directory_path() / ("tree" + std::to_string(folders))) {
        for (int folder = 0; folder < folders; ++folder) {
            std::filesystem::path const path = m_Root / ("folder " + std::to_string(folder));
            std::filesystem::create_directories(path);
            for (int file = 0; file < kFilesInFolder; ++file) {
                std::ofstream const made(path / ("file " + std::to_string(file) + ".txt"));
            }
        }
    }
    Tree(Tree const &) = delete;
    Tree &operator=(Tree const &) = delete;
    ~Tree() {
        std::error_code ignored;
        std::filesystem::remove_all(m_Root, ignored);
    }

    std::filesystem::path const &Root() const { return m_Root; }

  private:
    std::filesystem::path m_Root;
};

Tree const &TreeOf(int folders) {
    static std::unique_ptr<Tree> small;
    static std::unique_ptr<Tree> large;
    std::unique_ptr<Tree> &tree = folders < 100 ? small : large;
    if (tree == nullptr) {
        tree = std::make_unique<Tree>(folders);
    }
    return *tree;
}

KTPath PathOf(std::filesystem::path const &path) { return KTPath(KTString(path.c_str())); }

std::size_t ListByLibrary(KTPath const &root) {
    std::vector<KTString> names;
    KTFileUtil::GetFileNamesInFolderAtPathRecursively(root, names);
    return names.size();
}

// The same list: the files' paths from the folder on.
std::size_t ListByStandard(std::filesystem::path const &root) {
    std::vector<KTString> names;
    std::size_t const skipped = root.native().size() + 1;
    for (auto const &entry : std::filesystem::recursive_directory_iterator(root)) {
        if (entry.is_regular_file()) {
            names.emplace_back(entry.path().c_str() + skipped);
        }
    }
    return names.size();
}

void AddListing(char const *group, char const *size, int folders) {
    Add({group, "list", size}, kOurs, [folders](benchmark::State &state) {
        KTPath const root = PathOf(TreeOf(folders).Root());
        for (auto _ : state) {
            benchmark::DoNotOptimize(ListByLibrary(root));
        }
    });
}

void AddQuestions() {
    auto const file = [] { return TreeOf(20).Root() / "folder 7" / "file 42.txt"; };
    Add({kGroup, "exists", "one"}, kOurs, [file](benchmark::State &state) {
        KTFile const asked(PathOf(file()));
        for (auto _ : state) {
            benchmark::DoNotOptimize(asked.Exists());
        }
    });
    Add({kGroup, "exists", "one"}, kSystem, [file](benchmark::State &state) {
        std::wstring const asked = file().native();
        for (auto _ : state) {
            benchmark::DoNotOptimize(GetFileAttributesW(asked.c_str()) != INVALID_FILE_ATTRIBUTES);
        }
    });
    Add({kGroup, "get-size", "one"}, kOurs, [file](benchmark::State &state) {
        KTFile const asked(PathOf(file()));
        for (auto _ : state) {
            benchmark::DoNotOptimize(asked.GetSize());
        }
    });
    Add({kGroup, "get-size", "one"}, kSystem, [file](benchmark::State &state) {
        std::wstring const asked = file().native();
        for (auto _ : state) {
            WIN32_FILE_ATTRIBUTE_DATA data{};
            GetFileAttributesExW(asked.c_str(), GetFileExInfoStandard, &data);
            benchmark::DoNotOptimize((static_cast<KTUInt64>(data.nFileSizeHigh) << 32) | data.nFileSizeLow);
        }
    });
}

void AddPaths() {
    static constexpr wchar_t kFolder[] = L"C:\\courses\\harbour safety";
    static constexpr wchar_t kName[] = L"panorama of the quay.png";
    Add({kGroup, "append", "one"}, kOurs, [](benchmark::State &state) {
        KTPath const folder{KTString(kFolder)};
        KTString const name(kName);
        for (auto _ : state) {
            KTPath path(folder);
            path.Append(name);
            benchmark::DoNotOptimize(path);
        }
    });
    Add({kGroup, "append", "one"}, kStandard, [](benchmark::State &state) {
        std::filesystem::path const folder(kFolder);
        std::filesystem::path const name(kName);
        for (auto _ : state) {
            std::filesystem::path path(folder);
            path /= name;
            benchmark::DoNotOptimize(path);
        }
    });
    Add({kGroup, "split", "one"}, kOurs, [](benchmark::State &state) {
        KTFile const file(KTString(L"C:\\courses\\harbour safety\\panorama of the quay.png"));
        for (auto _ : state) {
            benchmark::DoNotOptimize(KTFileUtil::GetPathOnly(file, 0));
            benchmark::DoNotOptimize(KTFileUtil::GetBaseFileName(file));
            benchmark::DoNotOptimize(KTFileUtil::GetExtension(file));
        }
    });
    Add({kGroup, "split", "one"}, kStandard, [](benchmark::State &state) {
        std::filesystem::path const file(L"C:\\courses\\harbour safety\\panorama of the quay.png");
        for (auto _ : state) {
            benchmark::DoNotOptimize(file.parent_path());
            benchmark::DoNotOptimize(file.stem());
            benchmark::DoNotOptimize(file.extension());
        }
    });
}

} // namespace

void AddFileBenchmarks() {
    DescribeGroup(kList, "KTFileUtil's recursive listing");
    ExpectSpeed(kList, kStandard, 1.0);
    AddListing(kList, "20K", 200);
    Add({kList, "list", "20K"}, kStandard, [](benchmark::State &state) {
        std::filesystem::path const root = TreeOf(200).Root();
        for (auto _ : state) {
            benchmark::DoNotOptimize(ListByStandard(root));
        }
    });
    DescribeGroup(kGroup, "KTFile's questions about one file; paths joined and cut");
    ExpectSpeed(kGroup, kStandard, 1 / 1.3);
    ExpectSpeed(kGroup, kSystem, 1 / 1.3);
    AddQuestions();
    AddPaths();
    DescribeGrowthGroup(kGrowth, "cost as the tree grows from 2,000 to 20,000 files");
    AddListing(kGrowth, "1x", 20);
    AddListing(kGrowth, "10x", 200);
}

} // namespace bench
