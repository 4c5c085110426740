<?xml version="1.0" encoding="UTF-8"?>
<!-- Falling snow on the garage and, from an intensity file, on the yard's pixels. The
     star over the garage was added but never given an event. -->
<sequence formatVersion="1" length="90000">
  <channels>
    <channel id="1" name="Garage" deviceType="1" network="0" unit="13" circuit="1">
      <event start="0" end="45000" from="0" to="60"/>
      <event start="45000" end="90000" from="60" to="0"/>
    </channel>
    <channel id="2" name="Star" deviceType="1" network="0" unit="13" circuit="2"/>
  </channels>
  <tracks>
    <track name="Garage">
      <channelRef id="1"/>
      <channelRef id="2"/>
    </track>
    <track name="Yard">
      <intensityFile kind="Gridcraft" name="snow.gci">
        <device deviceType="7" network="1" start="101" count="60"/>
      </intensityFile>
    </track>
  </tracks>
</sequence>
