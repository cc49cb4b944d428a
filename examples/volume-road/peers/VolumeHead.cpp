#include "VolumeHead.h"

#include <string>
#include <vector>

namespace {

void writeTexts(TmMsg& msg, const std::vector<std::string>& texts)
{
    msg << static_cast<int>(texts.size());
    for (const std::string& text : texts)
        msg << text;
}

bool readTexts(TmMsg& msg, std::vector<std::string>& texts)
{
    int count = 0;
    msg >> count;
    for (int i = 0; i < count; ++i) {
        if (!msg.holds(1))
            return false;
        msg >> texts.emplace_back();
    }
    return count >= 0;
}

void writeWindows(TmMsg& msg, const Windows& windows)
{
    std::vector<std::string> texts;
    for (const KpWindowLevel& preset : windows.presets)
        texts.insert(texts.end(), {preset.centerString(), preset.widthString(), preset.explanation()});
    writeTexts(msg, texts);
    msg << static_cast<int>(windows.function) << windows.isInverted << windows.origin;
}

bool readWindows(TmMsg& msg, Windows& windows)
{
    std::vector<std::string> texts;
    int function = 0;
    const bool isWhole = readTexts(msg, texts) && texts.size() % 3 == 0;
    msg >> function >> windows.isInverted >> windows.origin;
    for (size_t i = 0; isWhole && i < texts.size(); i += 3)
        windows.presets.emplace_back(texts[i], texts[i + 1], texts[i + 2]);
    windows.function = static_cast<Window::Function>(function);
    return isWhole && function >= Window::Linear && function <= Window::Sigmoid;
}

}  // namespace

void writeHead(TmMsg& msg, const Series& series, const Volume& volume, const HxParamBundle& root)
{
    TmMsg head;
    head << static_cast<int>(series.planes.size()) << series.frameUid();
    writeTree(head, root);
    writeGeometry(head, volume);
    writeWindows(head, series.windows);
    writeTexts(head, series.warnings);
    msg << volumeMark << static_cast<unsigned int>(head.size());
    msg.writeRawBytes(head.size(), head.dataPtr());
}

bool readHead(TmMsg& head, Series& series, Volume& volume, HxParamBundle& root)
{
    int images = 0;
    Image plane;
    head >> images >> plane.frameUid;
    if (images < 1 || images > 1 << 16)
        return false;
    series.planes.assign(static_cast<size_t>(images), plane);
    return readTree(head, root) && readGeometry(head, volume) && readWindows(head, series.windows) &&
           readTexts(head, series.warnings) && head.readOffset() == head.size();
}
