// Ultra HDR photos of our own making: a JPEG file, the map behind it, and every claim that readers look for.
import sharp from 'sharp'

const hdrgm = 'http://ns.adobe.com/hdr-gain-map/1.0/'

const fields =
  'hdrgm:Version="1.0" hdrgm:GainMapMin="0.25" hdrgm:GainMapMax="2.5" hdrgm:Gamma="1.25" ' +
  'hdrgm:OffsetSDR="0.015625" hdrgm:OffsetHDR="0.03125" hdrgm:HDRCapacityMin="0.125" ' +
  'hdrgm:HDRCapacityMax="2.25" hdrgm:BaseRenditionIsHDR="False"'

async function jpeg(width, height, colourAt) {
  const pixels = Buffer.alloc(width * height * 3)
  for (let y = 0; y < height; y++) {
    for (let x = 0; x < width; x++) {
      pixels.set(colourAt(x / width, y / height), (y * width + x) * 3)
    }
  }
  return sharp(pixels, { raw: { width, height, channels: 3 } }).jpeg({ quality: 90 }).toBuffer()
}

function segment(marker, payload) {
  const head = Buffer.from([0xff, marker, 0, 0])
  head.writeUInt16BE(payload.length + 2, 2)
  return Buffer.concat([head, payload])
}

function xmp(description) {
  const text =
    'http://ns.adobe.com/xap/1.0/\0<x:xmpmeta xmlns:x="adobe:ns:meta/"><rdf:RDF ' +
    'xmlns:rdf="http://www.w3.org/1999/02/22-rdf-syntax-ns#">' +
    `<rdf:Description xmlns:hdrgm="${hdrgm}" ${description}</rdf:RDF></x:xmpmeta>`
  return segment(0xe1, Buffer.from(text, 'latin1'))
}

function containerOf(mapSize) {
  const item = (what) =>
    `<rdf:li rdf:parseType="Resource"><Container:Item Item:Mime="image/jpeg" ${what}/></rdf:li>`
  return xmp(
    'xmlns:Container="http://ns.google.com/photos/1.0/container/" ' +
      'xmlns:Item="http://ns.google.com/photos/1.0/container/item/" hdrgm:Version="1.0">' +
      `<Container:Directory><rdf:Seq>${item('Item:Semantic="Primary"')}` +
      item(`Item:Semantic="GainMap" Item:Length="${mapSize}"`) +
      '</rdf:Seq></Container:Directory></rdf:Description>')
}

function exifWith(orientation) {
  const tiff = Buffer.from('Exif\0\0MM\0*\0\0\0\x08\0\x01\x01\x12\0\x03\0\0\0\x01\0\0\0\0\0\0\0\0', 'latin1')
  tiff.writeUInt16BE(orientation, 24)
  return segment(0xe1, tiff)
}

// Two pictures, the second `offset` bytes behind the byte order mark.
function pictureIndex(primarySize, offset, size) {
  const head = 4, entries = head + 8 + 2 + 3 * 12 + 4
  const index = Buffer.alloc(entries + 2 * 16)
  index.write('MPF\0MM\0*', 'latin1')
  index.writeUInt32BE(8, head + 4)
  index.writeUInt16BE(3, head + 8)
  const tags = [
    [0xb000, 7, 4, 0x30313030], // version 0100
    [0xb001, 4, 1, 2],
    [0xb002, 7, 32, entries - head]
  ]
  tags.forEach(([tag, type, count, value], i) => {
    const at = head + 10 + 12 * i
    index.writeUInt16BE(tag, at)
    index.writeUInt16BE(type, at + 2)
    index.writeUInt32BE(count, at + 4)
    index.writeUInt32BE(value, at + 8)
  })
  index.writeUInt32BE(0x030000, entries)
  index.writeUInt32BE(primarySize, entries + 4)
  index.writeUInt32BE(size, entries + 20)
  index.writeUInt32BE(offset, entries + 24)
  return segment(0xe2, index)
}

function behindTheStart(file, ...segments) {
  return Buffer.concat([file.subarray(0, 2), ...segments, file.subarray(2)])
}

export async function ultraHdr(orientation) {
  const map = behindTheStart(await jpeg(160, 96, (x, y) => Array(3).fill(255 * (x + y) / 2)),
                             xmp(fields + '/>'))
  const picture = await jpeg(640, 384, (x, y) => [255 * x, 255 * y, 90])
  const before = [exifWith(orientation), containerOf(map.length)]
  const place = 2 + before[0].length + before[1].length + 8 // of the index's byte order mark
  const size = picture.length + place - 10 + pictureIndex(0, 0, 0).length
  const index = pictureIndex(size, size - place, map.length)
  return { file: Buffer.concat([behindTheStart(picture, ...before, index), map]), map }
}

// The map's own words, for comparison.
export function hdrgmOf(map) {
  const text = map.toString('latin1')
  return [...text.matchAll(/hdrgm:(\w+)="([^"]*)"/g)].map(([, name, value]) => `${name}=${value}`).sort()
}
