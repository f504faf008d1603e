#include "moka/graphics/loader/BitmapLoaderInterface.h"

namespace Moka {

BitmapLoaderInterface::~BitmapLoaderInterface() = default;

void BitmapLoaderInterface::OnLoad(int, String const&, Bitmap&) {}
void BitmapLoaderInterface::OnLoad(int, String const&, IMKBitmap&) {}
void BitmapLoaderInterface::OnLoadList(int, String const&, std::vector<Bitmap*>&) {}
void BitmapLoaderInterface::OnLoadList(int, String const&, std::vector<IMKBitmap*>&) {}

} // namespace Moka
