// Reads arbitrary bytes as a morph loader configuration document into plain data. Every input
// must give either a document or a load error text; no widget and no file is involved, so the
// reader's parsing and checks run at thousands of inputs a second.

#include "sharedsource/loaderui/sgmorphconfigurationdocument.h"

#include <cstdint>
#include <cstdlib>

namespace {

// Walks the whole tree, as applying it to the rows does.
int countElements(const SgConfigurationElement &element) {
    int count = 1;
    for (const SgConfigurationElement &child : element.children)
        count += countElements(child);
    return count;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    SgMorphConfigurationDocument document;
    const QByteArray bytes(reinterpret_cast<const char *>(data), qsizetype(size));
    if (!document.read(bytes)) {
        // A refused document always says why, and keeps nothing.
        if (document.error().isEmpty() || !document.fileType().children.isEmpty())
            std::abort();
        return 0;
    }
    const SgConfigurationElement &fileType = document.fileType();
    if (countElements(fileType) > int(size))
        std::abort(); // every element costs at least one byte of input
    fileType.firstBelow(QStringLiteral("Pose"));
    fileType.allBelow(QStringLiteral("Object"));
    return 0;
}
