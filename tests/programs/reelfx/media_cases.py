"""The table of media_cases_test.py: clips of every kind through `reelfx`, and what ffprobe must say of the result.

A case is (name, input, arguments, wanted). `{i}` is the input, `{o}` the folder of the result. `wanted` names values that
probe() of media_cases_test.py gives, such as "v:0 width", or one of its special checks.
"""

PICTURE = "-f lavfi -i testsrc=size=64x48:rate=25:duration=1"
TONE = "-f lavfi -i sine=440:duration=1:sample_rate=48000"
SIX = "-f lavfi -i \"aevalsrc='sin(440*t)|0|0|0|0|0':duration=1:sample_rate=48000:channel_layout=5.1\""
# Each quarter of the picture has its own colour, red at the top left.
QUARTERS = ("-f lavfi -i color=red:size=32x24:rate=25:duration=0.4 -f lavfi -i color=lime:size=32x24:rate=25 "
            "-f lavfi -i color=blue:size=32x24:rate=25 -f lavfi -i color=white:size=32x24:rate=25 -filter_complex "
            "[0][1]hstack=shortest=1[a];[2][3]hstack[b];[a][b]vstack=shortest=1")
FLASH = ("-f lavfi -i \"color=black:size=64x48:rate=25:duration=2,drawbox=t=fill:color=white:enable='eq(n,25)'\" "
         "-f lavfi -i \"aevalsrc='gt(t,1)*lt(t,1.04)*sin(2*PI*1000*t)':sample_rate=48000:duration=2\"")
SRT = "1\n00:00:00,200 --> 00:00:00,700\nA line\n"
CHAPTERS = (";FFMETADATA1\ntitle=A film\nartist=Somebody\n[CHAPTER]\nTIMEBASE=1/1000\nSTART=0\nEND=400\ntitle=One\n"
            "[CHAPTER]\nTIMEBASE=1/1000\nSTART=400\nEND=1000\ntitle=Two\n")
HDR = ("-x265-params log-level=none:hdr10=1:master-display=G(13250,34500)B(7500,3000)R(34000,16000)WP(15635,16450)"
       "L(10000000,1):max-cll=1000,400 -tag:v hvc1 -color_primaries bt2020 -color_trc smpte2084 -colorspace bt2020nc")

# Steps finer than those of 8 bits. The values of the second are light, from below black to above white.
DEEP = ("-f lavfi -i \"nullsrc=size=64x48:rate=25:duration=0.2,format=gbrp16le,geq=r='X*1000+Y':g='Y*1300':b='X*Y*20+7'\" "
        "-pix_fmt")
LIGHT = ("-f lavfi -i \"nullsrc=size=64x48,format=gbrpf32le,geq=r='X/20-0.5':g='0.2140':b='Y/48'\" -frames:v 1 "
         "-pix_fmt gbrpf32le")

# Inputs: the file's name, and how ffmpeg makes it. Later ones may use earlier ones; {f} is their folder.
INPUTS = {
    "plain.mp4": f"{PICTURE} {TONE} -pix_fmt yuv420p -c:v libx264 -c:a aac",
    "lying.mkv": f"{QUARTERS} -c:v ffv1 -pix_fmt yuv420p",
    "lying.mp4": f"{QUARTERS} -c:v libx264 -pix_fmt yuv420p",
    "turned.mp4": "-i {f}/lying.mp4 -c copy -metadata:s:v rotate=90",
    "lying.jpg": f"{QUARTERS} -frames:v 1 -pix_fmt yuvj444p -q:v 1",
    "flac.mkv": f"{PICTURE} {TONE} -c:v libx264 -c:a flac",
    "opus.mkv": f"{PICTURE} {TONE} -c:v libx264 -c:a libopus",
    "truehd.mkv": f"{PICTURE} {TONE} -c:v libx264 -c:a truehd -strict -2",
    "adpcm.mov": f"{PICTURE} {TONE} -c:v libx264 -c:a adpcm_ima_qt",
    "ac3.mts": f"{PICTURE} {SIX} -c:v libx264 -pix_fmt yuv420p -c:a ac3 -f mpegts",
    "aac.ts": f"{PICTURE} {TONE} -c:v libx264 -pix_fmt yuv420p -c:a aac -f mpegts",
    "second.ts": f"{PICTURE} {TONE} -c:v libx264 -pix_fmt yuv420p -c:a aac -f mpegts",
    "alpha.mov": "-f lavfi -i color=red@0.5:size=64x48:rate=25:duration=0.4,format=yuva444p10le -c:v prores_ks "
                 "-profile:v 4444 -pix_fmt yuva444p10le",
    "alpha.webm": "-f lavfi -i color=red@0.5:size=64x48:rate=25:duration=0.4,format=yuva420p -c:v libvpx-vp9 "
                  "-pix_fmt yuva420p",
    "full.mp4": "-f lavfi -i color=0x151515:size=64x48:rate=25:duration=0.4,scale=out_range=full,format=yuvj420p "
                "-c:v libx264 -pix_fmt yuvj420p",
    # 57 places at 25 frames a second, of which 26 have a frame.
    "uneven.mkv": "-f lavfi -i \"testsrc=size=64x48:rate=25:duration=2.28,select='lt(n,10)+eq(mod(n,3),2)*gt(n,10)'\" "
                  "-fps_mode passthrough -c:v libx264 -pix_fmt yuv420p",
    "chapters.mkv": f"{PICTURE} {TONE} -i {{f}}/chapters.txt -map 0 -map 1 -map 0 -map_metadata 2 -map_chapters 2 "
                    "-c:v libx264 -pix_fmt yuv420p -c:a aac -attach {f}/font.ttf "
                    "-metadata:s:3 mimetype=application/x-truetype-font",
    "cover.png": "-f lavfi -i color=green:size=16x16 -frames:v 1",
    "cover.mp4": f"{PICTURE} -i {{f}}/cover.png -map 0 -map 1 -c:v:0 libx264 -pix_fmt:v:0 yuv420p -c:v:1 png "
                 "-disposition:v:1 attached_pic",
    "text.mkv": f"{PICTURE} -i {{f}}/text.srt -map 0 -map 1 -c:v libx264 -pix_fmt yuv420p -c:s srt",
    "text.mp4": f"{PICTURE} -i {{f}}/text.srt -map 0 -map 1 -c:v libx264 -pix_fmt yuv420p -c:s mov_text",
    "grey16.mkv": "-f lavfi -i testsrc=size=64x48:rate=25:duration=0.2 -c:v ffv1 -pix_fmt gray16le",
    **{f"gap-{n}.png": "-f lavfi -i testsrc=size=64x48 -frames:v 1" for n in (2, 3, 5)},
    "many.mkv": f"{PICTURE} {TONE} {TONE} {PICTURE} -map 0 -map 1 -map 2 -map 3 -c:v libx264 -pix_fmt yuv420p -c:a flac",
    "cd.mkv": f"{PICTURE} -f lavfi -i sine=440:duration=1:sample_rate=44100 -c:v libx264 -pix_fmt yuv420p -c:a flac",
    "palette.png": "-f lavfi -i testsrc=size=64x48 -frames:v 1 -pix_fmt pal8",
    "grey.png": "-f lavfi -i nullsrc=size=256x16,format=gbrp,geq=r=X:g=X:b=X,extractplanes=r -frames:v 1",
    "hdr.mp4": f"-f lavfi -i testsrc=size=64x64:rate=25:duration=0.4 -pix_fmt yuv420p10le -c:v libx265 {HDR}",
    "fields.ts": "-f lavfi -i testsrc=size=720x576:rate=50:duration=0.4,interlace,setsar=64/45 -c:v mpeg2video -q:v 3 "
                 "-flags +ildct+ilme -pix_fmt yuv420p",
    "late.mp4": f"{PICTURE} {TONE} -output_ts_offset 5 -c:v libx264 -pix_fmt yuv420p -c:a aac",
    "late.mkv": f"-itsoffset 5 {PICTURE} -f lavfi -i sine=440:duration=6 -c:v libx264 -pix_fmt yuv420p -c:a aac",
    "early.mkv": f"{FLASH} -c:v libx264 -pix_fmt yuv420p -c:a pcm_s16le -output_ts_offset -0.5 "
                 "-avoid_negative_ts disabled",
    "long.mkv": "-f lavfi -i testsrc2=size=160x120:rate=25:duration=4 -c:v libx264 -g 25 -pix_fmt yuv420p",
    "long.ts": "-f lavfi -i testsrc2=size=160x120:rate=25:duration=4 -c:v libx264 -g 25 -pix_fmt yuv420p",
    "code.mov": f"{PICTURE} -c:v libx264 -pix_fmt yuv420p -timecode 01:00:00:00",
    "rgb.mkv": f"{PICTURE} -c:v ffv1 -pix_fmt bgr0",
    "rgb48.png": "-f lavfi -i testsrc=size=64x48 -frames:v 1 -pix_fmt rgb48be",
    "deep.mp4": f"{DEEP} yuv420p10le -c:v libx265 -x265-params log-level=none -tag:v hvc1",
    "hlg.mp4": f"{DEEP} yuv420p10le -c:v libx265 -x265-params log-level=none -tag:v hvc1 -color_primaries bt2020 "
               "-color_trc arib-std-b67 -colorspace bt2020nc",
    "deep-hq.mov": f"{DEEP} yuv422p10le -c:v prores_ks -profile:v hq",
    "deep-4444.mov": f"{DEEP} yuva444p10le -c:v prores_ks -profile:v 4444",
    "deep-v210.mov": f"{DEEP} yuv422p10le -c:v v210",
    "deep-av1.mp4": f"{DEEP} yuv420p10le -c:v libaom-av1 -cpu-used 8",
    "deep-vp9.webm": f"{DEEP} yuv420p10le -c:v libvpx-vp9 -profile:v 2",
    **{f"deep-{pixels}.mkv": f"{DEEP} {pixels} -c:v ffv1"
       for pixels in ("yuv444p16le", "gbrp16le", "gbrap16le", "gbrp12le", "gray16le", "gray10le")},
    **{f"deep-{pixels}.y4m": f"{DEEP} {pixels} -strict -1" for pixels in ("yuv420p10", "yuv444p12")},
    **{f"deep-{pixels}.png": f"{DEEP} {pixels} -frames:v 1" for pixels in ("rgb48be", "rgba64be", "gray16be", "ya16be")},
    **{f"deep-{pixels}.tif": f"{DEEP} {pixels} -frames:v 1" for pixels in ("rgb48le", "rgba64le", "gray16le")},
    **{f"deep-{pixels}.dpx": f"{DEEP} {pixels} -frames:v 1" for pixels in ("gbrp10le", "gbrp12le", "rgb48be")},
    "light.exr": LIGHT, "half.exr": f"{LIGHT} -format half",
    "grow-a.ts": f"{PICTURE} -c:v mpeg2video -pix_fmt yuv420p",
    "grow-b.ts": "-f lavfi -i testsrc=size=128x96:rate=25:duration=1 -c:v mpeg2video -pix_fmt yuv420p "
                 "-output_ts_offset 1",
    "gap.mkv": f"{FLASH} -af \"aresample=44100,aselect='lt(t,0.2)+gt(t,0.7)'\" -c:v libx264 -pix_fmt yuv420p -c:a flac",
    "wild.mkv": f"{FLASH} -c:v libx264 -pix_fmt yuv420p -c:a flac -bsf:a setts=ts='TS+36000000*gte(N\\,5)'",
    "flash.mov": f"{FLASH} -c:v libx264 -pix_fmt yuv420p -c:a pcm_s16le",
    "edit.mp4": "-ss 0.5 -i {f}/plain.mp4 -c copy",
    "tags.mp4": f"{PICTURE} -c:v libx264 -pix_fmt yuv420p -color_primaries smpte170m -color_trc smpte170m -colorspace "
                "smpte170m -color_range tv",
    "wide.mp4": "-f lavfi -i testsrc=size=64x48:rate=25:duration=0.4,setsar=16/11 -c:v libx264 -pix_fmt yuv420p",
    "odd.mkv": "-f lavfi -i testsrc=size=61x47:rate=25:duration=0.4 -c:v ffv1 -pix_fmt yuv420p",
    **{f"rate{n}.mp4": f"-f lavfi -i testsrc=size=64x48:rate={rate}:duration={seconds} -c:v libx264 -pix_fmt yuv420p"
       for n, rate, seconds in ((24, "24000/1001", 1), (60, "60000/1001", 0.5), (1000, "1000", 0.05))},
}

PLAIN = ("-e", "Film Look", "-p", "Reset To None")
SEPIA = ("-e", "Film Look", "-p", "Sepia")


def render(target, *options, effect=SEPIA):
    return ("render", "{i}", "{o}/" + target, *effect, *options)


CASES = [
    *((f"1 turned to {end}", "turned.mp4", render(f"o.{end}", *more, effect=PLAIN),
       {"v:0 width": 48, "v:0 height": 64, "corners": "lime white red blue", "says": "turned"})
      for end, *more in (("mkv",), ("webm",), ("avi",), ("gif",), ("y4m",), ("png", "--frames", ":1"))),
    ("1 the tag stays in MP4", "turned.mp4", render("o.mp4", effect=PLAIN),
     {"v:0 width": 64, "turn": 90, "corners": "lime white red blue", "quiet": True}),
    ("1 --upright", "turned.mp4", render("o.mp4", "--upright", effect=PLAIN),
     {"v:0 width": 48, "turn": 0, "corners": "lime white red blue"}),
    ("2 JPEG on its side", "exif6.jpg", render("o.jpg", effect=PLAIN),
     {"v:0 width": 48, "corners": "blue red white lime", "exif": 1}),
    ("2 mirrored JPEG to PNG", "exif2.jpg", render("o.png", effect=PLAIN), {"corners": "lime red white blue"}),
    ("2 frame", "exif6.jpg", ("frame", "{i}", "{o}/o.png", *PLAIN, "--width", "48"), {"corner": "blue"}),
    ("3 FLAC to MOV", "flac.mkv", render("o.mov"), {"a:0 codec_name": "aac", "says": "aac"}),
    ("3 Opus to AVI", "opus.mkv", render("o.avi"), {"a:0 codec_name": "mp3", "says": "mp3"}),
    ("3 TrueHD to MP4", "truehd.mkv", render("o.mp4"), {"a:0 codec_name": "aac", "says": "aac"}),
    ("3 ADPCM to MP4", "adpcm.mov", render("o.mp4"), {"a:0 codec_name": "aac", "says": "aac"}),
    ("4 AC-3 to MTS", "ac3.mts", render("o.mts"), {"a:0 codec_name": "ac3", "a:0 channels": 6, "v:0 codec_name": "h264"}),
    ("4 AAC to TS", "aac.ts", render("o.ts"), {"a:0 codec_name": "aac"}),
    ("5 alpha to MOV", "alpha.mov", render("o.mov"), {"v:0 codec_name": "prores", "alpha": 128}),
    ("5 alpha to QuickTime Animation", "alpha.mov", render("o.mov", "--codec", "qtrle"), {"alpha": 128}),
    ("5 alpha to WebM", "alpha.webm", render("o.webm"), {"alpha": 128, "v:0 tags alpha_mode": "1"}),
    ("5 alpha to MP4", "alpha.webm", render("o.mp4"), {"v:0 tags alpha_mode": None, "says": "transparency"}),
    *((f"6 full range to {end}", "full.mp4", render(f"o.{end}", *more, effect=PLAIN), {"grey": 21})
      for end, *more in (("mov", "--codec", "prores_ks"), ("avi",), ("ts",), ("mpg",), ("ogv",), ("mkv",))),
    *((f"6 quality of {end}", "gap-2.png", render(f"o.{end}", effect=PLAIN), {"psnr": 32})
      for end in ("ogv", "webp", "jxl", "jpg", "mpg")),
    ("7 uneven to Y4M", "uneven.mkv", render("o.y4m"), {"frames": 57, "says": "repeated"}),
    ("7 uneven to images", "uneven.mkv", render("o-%03d.png"), {"files": 57}),
    ("7 --frames", "uneven.mkv", render("o.mkv", "--frames", "11:"), {"frames": 15}),
    ("7 --fps", "plain.mp4", render("o.mp4", "--fps", "50"), {"frames": 50, "v:0 r_frame_rate": "50/1"}),
    ("8 joined TS", "joined.ts", render("o.mp4"), {"frames": 50, "seconds": (1.9, 2.1)}),
    ("9 chapters, fonts, names", "chapters.mkv", render("o.mkv"),
     {"chapters": ["One", "Two"], "title": "A film", "kinds": "video audio video attachment", "quiet": True}),
    ("9 chapters to MP4", "chapters.mkv", render("o.mp4"),
     {"chapters": ["One", "Two"], "title": "A film", "says": "attachment"}),
    ("9 chapters of a section", "chapters.mkv", render("o.mkv", "--start", "0.5"), {"chapters": ["Two"]}),
    ("9 cover", "cover.mp4", render("o.mp4"), {"kinds": "video video", "v:1 disposition attached_pic": 1}),
    ("9 two sounds to FLV", "many.mkv", render("o.flv"), {"kinds": "video audio", "says": "sound is left out"}),
    ("9 H.264 to AVI", "many.mkv", render("o.avi"), {"kinds": "video audio audio", "says": "video is left out"}),
    ("9 sound to MXF", "cd.mkv", render("o.mxf"), {"a:0 sample_rate": "48000"}),
    ("10 text to MP4", "text.mkv", render("o.mp4"), {"s:0 codec_name": "mov_text", "text": "A line"}),
    ("10 text to MKV", "text.mp4", render("o.mkv"), {"s:0 codec_name": "subrip", "text": "A line"}),
    ("10 text to WebM", "text.mkv", render("o.webm"), {"s:0 codec_name": "webvtt", "text": "A line"}),
    *((f"11 a section with sound in {end}", "plain.mp4", render(f"o.{end}", "--start", "0.2", "--duration", "0.4"),
       {"frames": 10, "sound": (0.35, 0.401)}) for end in ("mp4", "mkv", "mov")),
    ("12 digests of a section", "uneven.mkv", ("render", "{i}", *SEPIA, "--hash", "--start", "1.5"),
     {"prints": "frame 19 md5"}),
    ("13 sequence from 1001", "seq-1001.png", ("render", "{f}/seq-%d.png", "{o}/o.mkv", *SEPIA), {"frames": 3}),
    ("13 --start-number", "seq-1001.png", ("render", "{f}/seq-%d.png", "{o}/o.mkv", *SEPIA, "--start-number", "1002"),
     {"frames": 2}),
    ("13 pattern", "seq-1001.png", ("render", "{f}/seq-*.png", "{o}/o.mkv", *SEPIA), {"frames": 3}),
    ("13 folder", "seq-1001.png", ("render", "{f}/folder", "{o}/o.mkv", *SEPIA), {"frames": 3}),
    ("13 a gap", "gap-2.png", ("render", "{f}/gap-%d.png", "{o}/o.mp4", *SEPIA), {"frames": 2, "says": "gap-4.png is missing"}),
    ("14 palette", "palette.png", render("o.png"), {"v:0 pix_fmt": "rgb24"}),
    ("14 grey", "grey.png", render("o.png", effect=PLAIN), {"v:0 pix_fmt": "rgb24", "ramp": True}),
    ("15 HDR10", "hdr.mp4", render("o.mp4"),
     {"v:0 codec_name": "hevc", "v:0 codec_tag_string": "hvc1", "v:0 color_transfer": "smpte2084",
      "v:0 pix_fmt": "yuv420p10le", "mastering": "1000/1 1000"}),
    ("16 fields to MPEG", "fields.ts", render("o.mpg"),
     {"v:0 codec_name": "mpeg2video", "v:0 sample_aspect_ratio": "64:45", "frames": 10}),
    ("16 info", "fields.ts", ("info", "{i}"), {"prints": "64:45"}),
    ("17 late start", "late.mp4", render("o.mkv"), {"frames": 25, "quiet": True}),
    ("17 late picture", "late.mkv", render("o.mkv", "--progress", "json"),
     {"frames": 25, "says": '{"frame":1,"frames":25,'}),
    ("18 truncated MKV", "cut.mkv", render("o.mkv"), {"code": 3, "says": "first", "frames": (40, 90)}),
    ("18 truncated TS", "cut.ts", render("o.mkv"), {"code": 3, "says": "first", "frames": (40, 90)}),
    ("19 stale tags", "aac.ts", render("o.mkv"), {"v:0 tags ENCODER": None}),
    ("19 stale tags of MKV", "flac.mkv", render("o.mp4"), {"v:0 tags encoder": None, "a:0 tags encoder": None}),
    ("20 timecode", "code.mov", render("o.mov", "--start", "0.4"), {"v:0 tags timecode": "01:00:00:10"}),
    ("21 x265", "fields.ts", render("o.mkv", "--codec", "libx265", "-q", "--audio", "none"), {"quiet": True}),
    ("21 SVT-AV1", "fields.ts", render("o.mkv", "--codec", "libsvtav1", "-q"), {"quiet": True}),
    ("23 negative start", "early.mkv", render("o.mkv", effect=PLAIN), {"step": 0.02}),
    ("25 RGB to MP4", "rgb.mkv", render("o.mp4"), {"v:0 pix_fmt": "yuv444p", "says": "yuv444p"}),
    ("25 RGB to FFV1", "rgb.mkv", render("o.mkv"), {"v:0 pix_fmt": "bgr0"}),
    ("25 16-bit grey to FFV1", "grey16.mkv", render("o.mkv"), {"v:0 pix_fmt": "yuv420p16le", "quiet": True}),
    ("25 16-bit grey to MP4", "grey16.mkv", render("o.mp4"), {"v:0 pix_fmt": "yuv420p10le", "says": "yuv420p10le"}),
    ("25 16-bit RGB to MP4", "rgb48.png", render("o.mp4"), {"v:0 pix_fmt": "yuv444p10le", "says": "yuv444p10le"}),
    ("sound alone", "plain.mp4", render("o.mp3"), {"code": 2, "says": "mp3"}),
    ("--rate of a clip", "plain.mp4", render("o.mp4", "--rate", "50"), {"code": 2, "says": "--fps"}),
    ("size change", "grow.ts", render("o.mkv"), {"like input": "frames", "says": "128x96"}),
    ("file: on both sides", "plain.mp4", ("render", "file:{i}", "file:{o}/o.mp4", *SEPIA), {"frames": 25}),
    ("--audio none", "text.mkv", render("o.mkv", "--audio", "none"), {"kinds": "video subtitle"}),
    ("--audio CODEC", "plain.mp4", render("o.mkv", "--audio", "flac"), {"a:0 codec_name": "flac"}),
    ("--audio copy", "flac.mkv", render("o.mov", "--audio", "copy"), {"code": 2, "says": "flac"}),
    ("MP4 on standard output", "plain.mp4", ("render", "{i}", "-", *SEPIA, "--format", "mp4"),
     {"stdout": True, "frames": 25, "a:0 codec_name": "aac"}),
    ("Matroska on standard output", "plain.mp4", ("render", "{i}", "-", *SEPIA, "--format", "matroska"),
     {"stdout": True, "frames": 25, "a:0 codec_name": "aac"}),
    *((f"{name} from standard input", name, ("render", "-", "{o}/o.mkv", *SEPIA),
       {"stdin": True, "frames": 25, "a:0 codec_name": codec})
      for name, codec in (("flac.mkv", "flac"), ("aac.ts", "aac"))),
    # Deep sources. Where nothing is lost, a neutral effect keeps every sample.
    *((f"deep {name}", name, render(f"o.{name.split('.')[-1]}", effect=PLAIN),
       {"like input": "v:0.codec_name v:0.pix_fmt digests"})
      for name in ("deep-v210.mov", "deep-yuv444p16le.mkv", "deep-gbrp16le.mkv", "deep-gbrap16le.mkv", "deep-gbrp12le.mkv",
                   "deep-yuv420p10.y4m", "deep-yuv444p12.y4m", "deep-rgb48be.png", "deep-rgba64be.png",
                   "deep-rgb48le.tif", "deep-rgba64le.tif", "deep-gbrp10le.dpx", "deep-gbrp12le.dpx", "deep-rgb48be.dpx",
                   "light.exr", "half.exr")),
    *((f"deep {name}", name, render(f"o.{name.split('.')[-1]}", effect=PLAIN), {"v:0 pix_fmt": pixels})
      for name, pixels in (("deep-gray16be.png", "rgb48be"), ("deep-ya16be.png", "rgba64be"),
                           ("deep-gray16le.tif", "rgb48le"), ("deep-gray16le.mkv", "yuv420p16le"),
                           ("deep-gray10le.mkv", "yuv420p10le"), ("deep.mp4", "yuv420p10le"),
                           ("deep-hq.mov", "yuv422p10le"), ("deep-4444.mov", "yuva444p12le"),
                           ("deep-av1.mp4", "yuv420p10le"), ("deep-vp9.webm", "yuv420p10le"))),
    *((f"deep info of {name}", name, ("info", "{i}"), {"prints": f"{bits} bits, effects work in float"})
      for name, bits in (("deep.mp4", 10), ("deep-4444.mov", 12), ("deep-rgba64be.png", 16), ("light.exr", 32),
                         ("deep-yuv420p10.y4m", 10))),
    ("deep --depth", "deep-hq.mov", render("o.mov", "--depth", "8", "--dry-run"), {"prints": "depth     8 bits"}),
    ("deep SVT-AV1 --dry-run", "hdr.mp4", render("o.mp4", "--codec", "libsvtav1", "--dry-run"),
     {"prints": "libsvtav1 yuv420p10le"}),
    ("deep to H.264", "deep-rgb48be.png", render("o.mp4"), {"says": "rgb48be becomes yuv444p10le"}),
    ("deep to JPEG", "deep-gray16be.png", render("o.jpg"), {"says": "gray16be becomes"}),
    ("deep HLG", "hlg.mp4", render("o.mp4"), {"v:0 color_transfer": "arib-std-b67", "v:0 pix_fmt": "yuv420p10le"}),
    ("deep HLG info", "hlg.mp4", ("info", "{i}"), {"prints": "high dynamic range (arib-std-b67)"}),
    # Light of 0.214 is half of white on a screen.
    ("deep light to PNG", "light.exr", render("o.png", effect=PLAIN), {"v:0 pix_fmt": "rgb48be", "middle": (127, 128)}),
    ("deep light as it is", "light.exr", render("o.png", "--linear-as-is", effect=PLAIN), {"middle": 54}),
    ("deep PNG to light", "deep-rgb48be.png", render("o.exr", effect=PLAIN), {"v:0 pix_fmt": "gbrpf32le", "middle": 49}),
    # What has always held.
    ("edit list", "edit.mp4", render("o.mp4"), {"like input": "frames"}),
    *((f"rate {name}", f"rate{name}.mp4", render("o.mp4"), {"like input": "frames v:0.r_frame_rate times"})
      for name in (24, 60, 1000)),
    ("colour tags", "tags.mp4", render("o.mkv"),
     {"like input": "v:0.color_space v:0.color_primaries v:0.color_transfer v:0.color_range"}),
    ("aspect", "wide.mp4", render("o.mkv"), {"like input": "v:0.sample_aspect_ratio"}),
    ("odd size", "odd.mkv", render("o.mp4"), {"like input": "v:0.width v:0.height"}),
    *((f"a gap in the sound in {end}", "gap.mkv", render(f"o.{end}", effect=PLAIN), {"step": 0.03}) for end in ("mov", "webm")),
    ("damaged times of sound", "wild.mkv", render("o.mov", effect=PLAIN),
     {"seconds": (0.9, 2.2), "says": "far behind the picture"}),
    *((f"flash and beep in {end}", "flash.mov", render(f"o.{end}", effect=PLAIN), {"step": 0.06 if end == "avi" else 0.03})
      for end in ("mp4", "mkv", "mov", "webm", "ts", "avi")),
]
