<?xml version="1.0" encoding="UTF-8"?>
<!-- A short sparkle, played inside the intro and by the porch button. -->
<sequence formatVersion="1" length="10000">
  <channels>
    <channel id="1" name="Sparkle" deviceType="1" network="0" unit="14" circuit="1" circuits="8">
      <event start="0" end="200" intensity="100"/>
      <event start="400" end="600" intensity="100"/>
      <event start="800" end="1000" intensity="100"/>
    </channel>
  </channels>
  <tracks>
    <track name="Sparkle">
      <channelRef id="1"/>
    </track>
  </tracks>
</sequence>
